#pragma once

#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"

namespace Orvane {

class FeedCore;

/// One look over all feeds that are subscribed to: starts those that are due, and finds when the
/// first of the others will be. Those that were started count no more: whoever hears of their ends
/// looks again.
class RefreshPass : Foundation::Uncopyable {
 public:
    /// What is due within `nowSeconds` is due, unless it was refreshed less than
    /// `FeedCore::sMinimumRefreshInterval` ago.
    explicit RefreshPass(double nowSeconds) : mNowSeconds(nowSeconds) {}

    /// Goes through the feeds in the order of their IDs. A failure that is not the database's is
    /// reported, and does not keep the feeds behind it waiting. Throws `SQLite::Exception`.
    void run();

    /// When a feed will be due again; null if none waits.
    Foundation::Date* getEarliestDate() const { return mEarliest.get(); }

 private:
    void visit(FeedCore& feed);

    const double mNowSeconds;
    Foundation::Ref<Foundation::Date> mEarliest;
};

}  // namespace Orvane
