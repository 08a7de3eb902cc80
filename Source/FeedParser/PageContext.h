#pragma once

#include "FeedParser/Context.h"
#include "FeedParser/Text/HTMLPage.h"

namespace Orvane::FeedParser {

/// A page of the web, of which the links in its head are wanted.
class PageContext : public Context {
 public:
    explicit PageContext(Tag theTag) : Context(theTag), page(new HTMLPage) {}

    bool handleFinishedChild(Context* child) override;
    void start() override;

    Foundation::Ref<HTMLPage> page;

 private:
    int mBases = 0;
};

}  // namespace Orvane::FeedParser
