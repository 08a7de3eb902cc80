#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"

namespace Foundation {

class URL;

/// Measures, while it lives, a piece of work that keeps the run loop from turning, and warns of one
/// that takes more than 100 ms with the feed that it was for. Everybody who has called the agent
/// waits for as long.
class LongWork : Uncopyable {
 public:
    static constexpr double kSeconds = 0.1;

    /// `what` is what is done, such as "parsing". It must outlive this. `feed` is the feed's URL,
    /// and null for work that is for none.
    explicit LongWork(const char* what, URL* feed = nullptr);
    ~LongWork();

 private:
    const char* mWhat;
    Ref<URL> mFeed;
    double mStart;
};

}  // namespace Foundation
