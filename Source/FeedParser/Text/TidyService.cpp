#include "FeedParser/Text/TidyService.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"

#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/time.h>

#include <algorithm>
#include <cmath>

namespace Orvane::FeedParser {

using Foundation::AutoreleasePool;
using Foundation::Logger;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;
using Outcome = TidyPipe::Outcome;

namespace {

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kIsSanitized = true;
#elif defined(__has_feature)
constexpr bool kIsSanitized = __has_feature(address_sanitizer);
#else
constexpr bool kIsSanitized = false;
#endif

void limit(__rlimit_resource resource, rlim_t value) {
    rlimit limits = {};
    getrlimit(resource, &limits);
    limits.rlim_cur = std::min(value, limits.rlim_max);
    setrlimit(resource, &limits);
}

/// From now on the process may work, and live, for one document.
void boundDocument() {
    rusage used = {};
    getrusage(RUSAGE_SELF, &used);
    const auto seconds = static_cast<rlim_t>(used.ru_utime.tv_sec + used.ru_stime.tv_sec);
    limit(RLIMIT_CPU, seconds + 1 + Bounds::kTidyProcessorSeconds);
    // Whoever waits for it kills it long before; this is for when nobody does any more.
    itimerval alarm = {};
    alarm.it_value.tv_sec = static_cast<time_t>(2 * std::ceil(Bounds::kTidySeconds));
    setitimer(ITIMER_REAL, &alarm, nullptr);
}

void endDocument() {
    const itimerval none = {};
    setitimer(ITIMER_REAL, &none, nullptr);
}

/// Keeps what is logged, for whoever asked.
class LogKeeper : public Foundation::LogSink {
 public:
    explicit LogKeeper(std::string& log) : mLog(log), mPrevious(Foundation::setLogSink(this)) {
        // Whoever asked decides what of it is written.
        for (Logger* logger : kKept)
            logger->setEnabled(true);
    }
    ~LogKeeper() override {
        for (Logger* logger : kKept)
            logger->setEnabled(false);
        Foundation::setLogSink(mPrevious);
    }
    LogKeeper(const LogKeeper&) = delete;
    LogKeeper& operator=(const LogKeeper&) = delete;

    void write(const Logger& logger, std::string_view text) override {
        constexpr std::size_t kMuch = 65536;
        const bool isWarning = &logger == &Foundation::gWarn;
        if ((!isWarning && &logger != &gLogParser) || mLog.size() > kMuch) return;
        mLog += isWarning ? '!' : ' ';
        mLog += text.substr(0, text.find('\n'));
        mLog += '\n';
    }

 private:
    /// The parser's log, and the general one, without which no other is on.
    static constexpr Logger* kKept[] = {&Foundation::gLog, &gLogParser};

    std::string& mLog;
    Foundation::LogSink* mPrevious;
};

template <class T>
Ref<Tidier> make() {
    return Returner<T>::adopted(new T);
}

}  // namespace

TidyService::TidyService(int fd) : mPipe(fd) {
    for (const Ref<Tidier>& tidier : {make<FeedTidier>(), make<HTMLDocumentTidier>(),
                                      make<HTMLSnippetTidier>(), make<XMLSnippetTidier>()}) {
        mTidiers.emplace(tidier->getClassName(), tidier);
    }
}

TidyService::~TidyService() = default;

void TidyService::boundProcess() {
    mIsBound = true;
    // A sanitizer's own tables take more address space than there is memory.
    if (!kIsSanitized) limit(RLIMIT_AS, Bounds::kTidyMemory);
    limit(RLIMIT_FSIZE, 0);
    // To end is in the order of things here, and nothing to keep a picture of.
    limit(RLIMIT_CORE, 0);
    prctl(PR_SET_DUMPABLE, 0);
    prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0);
}

int TidyService::run(double idleSeconds) {
    if (mPipe.sendReply({}, TidyPipe::kNever) != Outcome::Done) return 0;
    for (;;) {
        const double now = TidyPipe::monotonicSeconds();
        if (mPipe.awaitInput(now + idleSeconds) == Outcome::Late) return 0;
        const AutoreleasePool pool;
        TidyRequest request;
        const Outcome outcome = mPipe.receiveRequest(request, TidyPipe::kNever);
        if (outcome == Outcome::Ended) return 0;
        if (outcome != Outcome::Done) return 1;
        if (mIsBound) boundDocument();
        const TidyReply reply = tidy(request);
        if (mIsBound) endDocument();
        if (mPipe.sendReply(reply, TidyPipe::kNever) != Outcome::Done) return 0;
    }
}

TidyReply TidyService::tidy(const TidyRequest& request) {
    TidyReply reply;
    const LogKeeper keeper(reply.log);
    const auto found = mTidiers.find(request.className);
    if (found == mTidiers.end()) {
        reply.result = TidyResult::nothing("there is no such tidier");
        return reply;
    }
    const Ref<URL> base = URL::url(String::string(request.base));
    reply.result = found->second->tidyHere(request.markup, request.encoding, base.get());
    if (reply.result.output.size() > Bounds::kTidyBytes) {
        Bounds::logHit("kTidyBytes", Bounds::kTidyBytes);
        reply.result = TidyResult::nothing("the result is too long");
    }
    return reply;
}

}  // namespace Orvane::FeedParser
