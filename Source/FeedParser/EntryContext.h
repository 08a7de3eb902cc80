#pragma once

#include "FeedParser/Context.h"
#include "Model/EntryCore.h"

#include <cstddef>

namespace Orvane::FeedParser {

/// An entry of a feed, or of no feed.
class EntryContext : public Context {
 public:
    explicit EntryContext(Tag theTag) : Context(theTag), entry(new EntryCore) {}

    /// All of the element, which is kept so that the entry can be rebuilt.
    RawXMLType getRawXMLType() const override { return RawXMLType::Outer; }
    bool handleFinishedChild(Context* child) override;
    void start() override;
    void end() override;

    Foundation::Ref<EntryCore> entry;

 private:
    bool takeText(Context* child);
    bool takeDate(Context* child);
    void takeContent(Context* child);
    void takeGUID(Context* child);
    void takeLink(Context* child);
    void keepXML();

    std::size_t mEnclosures = 0;
};

}  // namespace Orvane::FeedParser
