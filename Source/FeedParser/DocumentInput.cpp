#include "FeedParser/DocumentInput.h"

#include "FeedParser/Text/Bounds.h"

#include <algorithm>
#include <cstring>
#include <ctime>

namespace Orvane::FeedParser {

namespace {

/// The processor time of the thread in seconds.
double processorSeconds() {
    timespec time = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    constexpr double kNanosecond = 1e-9;
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * kNanosecond;
}

}  // namespace

ParseBudget::ParseBudget(std::size_t documentBytes)
    : limit(Bounds::kParseSeconds +
            Bounds::kParseSecondsPerMiB * static_cast<double>(documentBytes) / (1U << 20)) {}

DocumentInput::DocumentInput(Foundation::Bytes document, ParseBudget& budget)
    : mRest(document), mBudget(budget), mStart(processorSeconds()) {}

DocumentInput::~DocumentInput() {
    mBudget.used += processorSeconds() - mStart;
}

int DocumentInput::read(void* input, char* buffer, int length) noexcept {
    return static_cast<DocumentInput*>(input)->read(buffer, length);
}

int DocumentInput::read(char* buffer, int length) {
    checkTime();
    if (mIsOverBudget || length <= 0) return 0;
    const std::size_t count = std::min(static_cast<std::size_t>(length), mRest.getLength());
    if (count == 0) return 0;
    std::memcpy(buffer, mRest.getBegin(), count);
    mRest.addBegin(static_cast<std::ptrdiff_t>(count));
    return static_cast<int>(count);
}

void DocumentInput::checkTime() {
    // Asking costs as much as parsing some hundred bytes.
    constexpr unsigned kReadsPerCheck = 4;
    if (mIsOverBudget || ++mReads % kReadsPerCheck != 0) return;
    if (mBudget.used + processorSeconds() - mStart <= mBudget.limit) return;
    mIsOverBudget = true;
    Bounds::logHit("milliseconds of parsing", static_cast<std::uint64_t>(mBudget.limit * 1000));
}

}  // namespace Orvane::FeedParser
