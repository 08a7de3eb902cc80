#pragma once

#include "Benchmarks/PlainRows.h"
#include "Support/ScriptedServer.h"

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <new>
#include <string>

/// Feeds to be fetched, from a process of its own, so that what serving them costs is nobody's.
namespace Benchmarks {

constexpr int kEntries = 50;
constexpr int kAuthors = 5;  ///< of a feed
constexpr int kTextBytes = 2048;
constexpr const char* kTag = "\"1\"";

/// The last `kEntries` of that many entries.
inline std::string documentOf(const std::string& path, int newest = kEntries) {
    std::string xml = "<rss version=\"2.0\"><channel><title>News</title>";
    for (int i = newest - kEntries; i < newest; ++i) {
        xml += fmt::format(
            "<item><title>The title of entry {0} of {1}</title>"
            "<guid isPermaLink=\"false\">{1}-{0}</guid>"
            "<author>{3}@example.org{1} (Author {3})</author>"
            "<pubDate>Tue, 06 Jun 2006 10:00:00 GMT</pubDate><description>{2}</description></item>",
            i, path, std::string(kTextBytes, static_cast<char>('a' + i % 26)), i % kAuthors);
    }
    return xml + "</channel></rss>";
}

/// Below "/tagged" with a validator, which is heeded; elsewhere without. Below "/rolling" each
/// entry stays for `kEntries` rounds. Ends with this process.
class FeedServer {
 public:
    FeedServer() : mSeen(new (shareMemory()) Seen) {
        int toParent[2], toChild[2];
        if (pipe(toParent) != 0 || pipe(toChild) != 0) throw std::runtime_error("pipe");
        mPID = fork();
        if (mPID == 0) {
            close(toChild[1]);
            serve(toParent[1], toChild[0]);
        }
        close(toChild[0]);
        mEnd = toChild[1];
        require(read(toParent[0], &mPort, sizeof mPort) == sizeof mPort, "no server");
    }
    ~FeedServer() {
        close(mEnd);
        waitpid(mPID, nullptr, 0);
    }
    FeedServer(const FeedServer&) = delete;
    FeedServer& operator=(const FeedServer&) = delete;

    std::string url(const char* kind, int feed) const {
        return fmt::format("http://127.0.0.1:{}/{}/{}.xml", mPort, kind, feed);
    }
    /// Begins a round: its requests are counted from here on, and the rolling feeds have news.
    void startRound() {
        mSeen->requests = mSeen->unchanged = 0;
        for (std::atomic<bool>& connection : mSeen->connections) {
            connection = false;
        }
        ++mSeen->round;
    }
    int getRequests() const { return mSeen->requests; }
    /// Those that were answered by 304.
    int getUnchanged() const { return mSeen->unchanged; }
    /// How many connections they came over.
    int getConnections() const {
        int count = 0;
        for (const std::atomic<bool>& connection : mSeen->connections) {
            if (connection) ++count;
        }
        return count;
    }

 private:
    /// What both processes know.
    struct Seen {
        std::atomic<int> round = 0;
        std::atomic<int> requests = 0;
        std::atomic<int> unchanged = 0;
        std::array<std::atomic<bool>, 1 << 16> connections = {};
    };

    static void* shareMemory() {
        void* memory =
            mmap(nullptr, sizeof(Seen), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        require(memory != MAP_FAILED, "no memory to share");
        return memory;
    }
    [[noreturn]] void serve(int port, int end) const {
        {
            Support::ScriptedServer server;
            server.answerOthersBy([this](const auto& request) { return answerTo(request); });
            const int number = server.getPort();
            static_cast<void>(!write(port, &number, sizeof number));
            char nothing;
            static_cast<void>(!read(end, &nothing, 1));
        }
        _exit(0);
    }
    Support::ServerAnswer answerTo(const Support::ServerRequest& request) const {
        ++mSeen->requests;
        mSeen->connections[static_cast<unsigned>(request.connection) % (1U << 16)] = true;
        const bool isTagged = request.path().starts_with("/tagged");
        if (isTagged && request.header("if-none-match") == kTag) {
            ++mSeen->unchanged;
            return Support::ServerAnswer(304).header("ETag", kTag);
        }
        const bool isRolling = request.path().starts_with("/rolling");
        Support::ServerAnswer answer;
        answer.header("Content-Type", "application/rss+xml")
            .body(documentOf(request.path(), kEntries + (isRolling ? mSeen->round.load() : 0)));
        if (isTagged) answer.header("ETag", kTag);
        return answer;
    }

    Seen* const mSeen;
    pid_t mPID = -1;
    int mPort = 0;
    int mEnd = -1;
};

}  // namespace Benchmarks
