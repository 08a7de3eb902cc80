#pragma once

#include <Orvane/OVObject.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

class OVContentInternal;

/// A text or other data with its type, such as what an entry says.
///
/// Getters throw `OVException` if the database cannot be read. Thread: see `OVObject`.
class OV_EXPORT OVContent : public OVObject {
 public:
    using Text = std::optional<std::string>;  ///< none for what there is not

    /// A content of the application's own, which is in no database. The bytes are copied. Throws
    /// `OVException` without data, which is a view of nothing and not one of 0 bytes, and without a
    /// type.
    static std::shared_ptr<OVContent> create(std::string_view data, const std::string& MIMEType);
    /// The same of plain text in UTF-8. Throws `OVException` for what is not.
    static std::shared_ptr<OVContent> createFromText(const std::string& text);
    /// The same of HTML in UTF-8. Throws as above.
    static std::shared_ptr<OVContent> createFromHTML(const std::string& html);

    ~OVContent() override;

    /// A media type; none counts as plain text.
    Text MIMEType() const;
    /// The bytes, tidied if they are markup; none if there are none.
    Text data() const;
    /// Whether it is plain text, HTML or XHTML.
    bool isTextual() const;
    /// The text without markup; none for what is no text.
    Text plainTextString() const;
    /// The text as HTML; none for what is neither plain text nor HTML.
    Text HTMLString() const;

    /// "OVContent[type, n bytes]". Throws as getters of values.
    std::string description() const override;
    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;

    OVContentInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVContent(std::unique_ptr<OVContentInternal> internal);

    std::unique_ptr<OVContentInternal> mInternal;
};
