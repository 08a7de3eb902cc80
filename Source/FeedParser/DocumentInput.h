#pragma once

#include "Foundation/Bytes.h"
#include "Foundation/Uncopyable.h"

namespace Orvane::FeedParser {

/// How much processor time the parsing of a document may take, over all attempts at it. Only the
/// thread's own time counts, and of that only what passes while a `DocumentInput` lives.
struct ParseBudget {
    explicit ParseBudget(std::size_t documentBytes);

    double limit;     ///< seconds
    double used = 0;  ///< seconds, in the attempts before this one
};

/// Hands a document out to libxml2 piece by piece, and ends it early where the time is up.
class DocumentInput : Foundation::Uncopyable {
 public:
    /// Both must outlive this.
    DocumentInput(Foundation::Bytes document, ParseBudget& budget);
    ~DocumentInput();

    /// For libxml2: copies up to `length` bytes to `buffer`, and gives their number. `input` is
    /// this.
    static int read(void* input, char* buffer, int length) noexcept;
    /// Whether the time was up.
    bool isOverBudget() const { return mIsOverBudget; }

 private:
    int read(char* buffer, int length);
    void checkTime();

    Foundation::Bytes mRest;
    ParseBudget& mBudget;
    double mStart;
    unsigned mReads = 0;
    bool mIsOverBudget = false;
};

}  // namespace Orvane::FeedParser
