#pragma once

#include "FeedParser/Context.h"
#include "Foundation/String.h"

namespace Orvane::FeedParser {

/// An element whose content is a text of some type.
class TextContext : public Context {
 public:
    enum ContentType : std::int32_t { Text = 0, HTML = 1, XHTML = 2, Other = 3 };

    explicit TextContext(Tag theTag) : Context(theTag) {}

    RawXMLType getRawXMLType() const override { return RawXMLType::Inner; }
    /// In RSS a text is HTML unless it says otherwise, in Atom it is plain.
    void start() override;
    void gotAttribute(const char* prefix, const char* name, const char* value) override;
    /// The text; may be null. Owned by this.
    virtual Foundation::String* getText() const { return text.get(); }

    mutable Foundation::Ref<Foundation::String> text;
    Foundation::Ref<Foundation::String> typeString;  ///< the MIME type of what is `Other`
    ContentType contentType = Text;

 protected:
    /// Undoes the escapes of `raw` in place, and trims the result.
    static void decodeEntities(std::string& text);
    /// An attribute's value without outer white space. Null for one that is no UTF-8, as libxml2
    /// gives it of documents in which it has found errors.
    static Foundation::StringReturner trimmed(const char* value);

 private:
    void setType(const char* value);
};

}  // namespace Orvane::FeedParser
