#pragma once

#include "FeedParser/PlainTextContext.h"
#include "FeedParser/Text/HTMLLink.h"
#include "Model/EnclosureCore.h"

namespace Orvane::FeedParser {

/// A link or an enclosure, in whichever dialect.
class LinkContext : public PlainTextContext {
 public:
    explicit LinkContext(Tag theTag);

    void gotAttribute(const char* prefix, const char* name, const char* value) override;
    void end() override;

    Foundation::Ref<HTMLLink> link;
    Foundation::Ref<EnclosureCore> enclosure;
    bool isEnclosure;
};

}  // namespace Orvane::FeedParser
