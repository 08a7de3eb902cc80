#pragma once

#include "FeedParser/Context.h"
#include "Model/ContentCore.h"
#include "Model/FeedCore.h"

namespace Orvane::FeedParser {

/// A feed of any dialect.
class FeedContext : public Context {
 public:
    explicit FeedContext(Tag theTag) : Context(theTag), feed(new FeedCore) {}

    /// All of the element, so that an error anywhere in it is found before anything is read.
    RawXMLType getRawXMLType() const override { return RawXMLType::Outer; }
    bool keepsRawXML() const override { return false; }
    bool handleFinishedChild(Context* child) override;
    void start() override;
    void end() override;

    Foundation::Ref<FeedCore> feed;
    /// The last description, unless another child gave the subtitle after it.
    Foundation::Ref<ContentCore> description;

 private:
    void setFormat(Info::Format format);
    bool takeText(Context* child);
    bool takeURL(Context* child);
    bool takeDate(Context* child);
    void takeLink(Context* child);
};

}  // namespace Orvane::FeedParser
