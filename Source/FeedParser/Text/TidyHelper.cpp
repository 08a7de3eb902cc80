#include "FeedParser/Text/TidyHelper.h"

#include "FeedParser/Text/Bounds.h"
#include "Foundation/InstalledTree.h"
#include "Foundation/Logger.h"
#include "Foundation/ProcessBeginning.h"
#include "Foundation/RunLoop.h"

#include <poll.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <utility>

extern char** environ;

namespace Orvane::FeedParser {

using Foundation::FileDescriptorSource;
using Foundation::gWarn;
using Foundation::InstalledTree;
using Foundation::ProcessBeginning;
using Foundation::RunLoop;
using Foundation::UniqueFD;
using Outcome = TidyPipe::Outcome;

namespace {

constexpr const char* kProgram = "/orvane-tidy";

/// Says here what the program said there.
void relay(std::string_view log) {
    while (!log.empty()) {
        const std::string_view line = log.substr(0, log.find('\n'));
        log.remove_prefix(std::min(line.size() + 1, log.size()));
        if (line.empty()) continue;
        const std::string text(line.substr(1));
        if (line[0] == '!') {
            gWarn.log("%s", text);
        } else {
            gLogParser.log("%s", text);
        }
    }
}

/// Where the helper is in a tree that was not installed, or was moved since: as far from the
/// program that runs as it would be there.
std::string pathBesideProgram() {
    std::error_code error;
    const auto program = std::filesystem::read_symlink("/proc/self/exe", error);
    const auto top = program.parent_path().parent_path();
    return (top / "libexec" / "orvane").string() + kProgram;
}

}  // namespace

TidyHelper& TidyHelper::getShared() {
    // Never destroyed: its program ends with the process by itself.
    static auto* const sInstance = new TidyHelper(Bounds::kTidySeconds);
    return *sInstance;
}

TidyHelper::TidyHelper(double seconds) : mSeconds(seconds) {}

TidyHelper::~TidyHelper() {
    stop();
}

std::string TidyHelper::getPath() {
    const char* set = std::getenv("ORVANE_PROGRAMS");
    if (set && *set) return std::string(set) + kProgram;
    const std::string installed =
        InstalledTree::findDirectory(ORVANE_PROGRAMS_FROM_LIBRARY, ORVANE_INSTALLED_PROGRAMS) +
        kProgram;
    if (access(installed.c_str(), X_OK) == 0) return installed;
    const std::string beside = pathBesideProgram();
    return access(beside.c_str(), X_OK) == 0 ? beside : installed;
}

bool TidyHelper::start() {
    int fds[2];
    if (socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, fds) != 0) return false;
    UniqueFD ours(fds[0]);
    const UniqueFD its(fds[1]);
    const ProcessBeginning beginning(its.get());
    const std::string path = getPath();
    const char* arguments[] = {path.c_str(), nullptr};
    pid_t pid;
    const int result = posix_spawn(&pid, path.c_str(), &beginning.actions, &beginning.attributes,
                                   const_cast<char**>(arguments), environ);
    if (result != 0) {
        if (!mHasWarned) gWarn.log("Can't start %s: %s", path, std::strerror(result));
        mHasWarned = true;
        return false;
    }
    mPID = pid;
    mSocket = std::move(ours);
    return true;
}

bool TidyHelper::isThere() {
    if (mPID < 0) return false;
    // It says nothing unasked: what can be read is its end.
    pollfd state = {mSocket.get(), POLLIN, 0};
    if (poll(&state, 1, 0) == 0) return true;
    stop();
    return false;
}

TidyPipe::Outcome TidyHelper::exchange(const char* className, std::string_view markup, int encoding,
                                       std::string_view base, TidyReply& reply) {
    const TidyPipe pipe(mSocket.get());
    const double deadline = TidyPipe::monotonicSeconds() + mSeconds;
    const Outcome outcome = pipe.sendRequest(className, encoding, base, markup, deadline);
    return outcome == Outcome::Done ? pipe.receiveReply(reply, deadline) : outcome;
}

TidyResult TidyHelper::tidy(const char* className, std::string_view markup, int encoding,
                            const Foundation::URL* base) {
    if (markup.size() > Bounds::kTidyBytes) {
        Bounds::logHit("kTidyBytes", Bounds::kTidyBytes);
        return TidyResult::nothing("it is too long");
    }
    const std::string baseText = base ? base->getAbsoluteString()->utf8() : std::string();
    // One that ends for want of work may do so just as work comes.
    for (int tries = 0; tries < 2; ++tries) {
        TidyReply reply;
        if (!isThere() && !startAndAwait()) {
            return TidyResult::nothing("orvane-tidy does not start");
        }
        switch (exchange(className, markup, encoding, baseText, reply)) {
            case Outcome::Done:
                relay(reply.log);
                return std::move(reply.result);
            case Outcome::Late:
                Bounds::logHit("kTidySeconds", static_cast<std::uint64_t>(mSeconds));
                reap();
                return TidyResult::nothing("it took too long");
            case Outcome::Broken:
                reap();
                return TidyResult::nothing("orvane-tidy made no sense");
            case Outcome::Ended:
                if (!reap()) return TidyResult::nothing("it has ended orvane-tidy");
        }
    }
    return TidyResult::nothing("orvane-tidy ends before it is asked");
}

bool TidyHelper::startAndAwait() {
    if (!start()) return false;
    const double deadline = TidyPipe::monotonicSeconds() + Bounds::kTidyStartSeconds;
    TidyReply hello;
    if (TidyPipe(mSocket.get()).receiveReply(hello, deadline) != Outcome::Done) {
        if (!mHasWarned) gWarn.log("%s does not start", getPath());
        mHasWarned = true;
        reap();
        return false;
    }
    mWatch = std::make_unique<FileDescriptorSource>(mSocket.get());
    mWatch->setReadHandler([this] { isThere(); });
    mWatch->addTo(RunLoop::current(), RunLoop::kCommonModes);
    return true;
}

void TidyHelper::stop() {
    if (mPID >= 0) reap();
}

bool TidyHelper::reap() {
    // The watch may be what called: the loop allows that.
    mWatch.reset();
    mSocket.close();
    const pid_t pid = std::exchange(mPID, -1);
    int status = 0;
    pid_t reaped = waitpid(pid, &status, WNOHANG);
    if (reaped == 0) {
        kill(pid, SIGKILL);
        do {
            reaped = waitpid(pid, &status, 0);
        } while (reaped < 0 && errno == EINTR);
    }
    return reaped == pid && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

}  // namespace Orvane::FeedParser
