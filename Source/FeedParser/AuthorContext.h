#pragma once

#include "FeedParser/TextContext.h"
#include "Model/AuthorCore.h"

namespace Orvane::FeedParser {

/// A person: of children in Atom, of one text in RSS.
class AuthorContext : public TextContext {
 public:
    explicit AuthorContext(Tag theTag) : TextContext(theTag), author(new AuthorCore) {}

    RawXMLType getRawXMLType() const override { return RawXMLType::InnerThenChildren; }
    bool handleFinishedChild(Context* child) override;
    void end() override;

    Foundation::Ref<AuthorCore> author;
    bool sawChild = false;
};

}  // namespace Orvane::FeedParser
