#pragma once

#include "FeedParser/TextContext.h"
#include "Foundation/MIMEType.h"
#include "Model/ContentCore.h"

namespace Orvane::FeedParser {

/// The text or summary of an entry.
class ContentContext : public TextContext {
 public:
    enum Mode : std::int32_t { None = 0, Escaped = 1, Base64 = 2 };

    explicit ContentContext(Tag theTag) : TextContext(theTag), content(new ContentCore) {}

    void gotAttribute(const char* prefix, const char* name, const char* value) override;
    void end() override;

    Foundation::Ref<ContentCore> content;
    Mode mode = None;

 private:
    void store(Foundation::MIMEType* type, bool isMarkup);
    void storeBinary();
};

}  // namespace Orvane::FeedParser
