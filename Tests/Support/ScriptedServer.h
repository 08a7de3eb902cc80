#pragma once

#include "Foundation/UniqueFD.h"
#include "Support/ServerAnswer.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace Support {

/// What a server was asked.
struct ServerRequest {
    std::string method;
    std::string target;                          ///< as in the request's line, with the query
    std::map<std::string, std::string> headers;  ///< by name in lower case
    int connection = 0;                          ///< which of the connections, from 1 on

    /// Empty for none. `name` is in lower case.
    std::string header(const std::string& name) const;
    std::string path() const { return target.substr(0, target.find('?')); }
};

/// An HTTP server on a port of the loopback device that answers by script, keeps connections, and
/// writes down what it was asked. It works in a thread of its own, so that it goes on whatever the
/// test does; all operations may be called from the test's thread at any time.
class ScriptedServer {
 public:
    using Answerer = std::function<ServerAnswer(const ServerRequest&)>;

    ScriptedServer();
    ~ScriptedServer();
    ScriptedServer(const ScriptedServer&) = delete;
    ScriptedServer& operator=(const ScriptedServer&) = delete;

    int getPort() const { return mPort; }
    /// The address of a path ("/feed"), with this host name.
    std::string url(const std::string& path, const std::string& host = "127.0.0.1") const;

    // The script. What is asked for and not in it is answered by 404.

    /// How a path is answered each time.
    void answer(const std::string& path, ServerAnswer answer);
    /// The same, by a function that is called in the server's thread.
    void answerBy(const std::string& path, Answerer answerer);
    /// How what has no answer of its own is answered, instead of by 404.
    void answerOthersBy(Answerer answerer);
    /// How the next request for a path is answered that no other such answer waits for.
    void answerOnce(const std::string& path, ServerAnswer answer);
    /// Lets as many more answers, or repeated waits of one, through a gate, one after the other.
    void letThrough(const std::string& gate, int times = 1);

    // What happened.

    std::vector<ServerRequest> getRequests() const;
    /// Those for a path, whatever their query.
    std::vector<ServerRequest> getRequests(const std::string& path) const;
    int getRequestCount() const;
    int getRequestCount(const std::string& path) const;
    /// Of connections: all that were made, those that are open, and the most at once.
    int getConnectionCount() const;
    int getOpenConnectionCount() const;
    int getMostConnections() const;
    /// How many answers wait at a gate now.
    int getWaitingCount(const std::string& gate) const;
    /// How many bytes were sent.
    std::uint64_t getSentBytes() const { return mSentBytes; }
    void forgetRequests();

 private:
    struct Connection;

    void run();
    void wake();
    void accept();
    void drop(std::unique_ptr<Connection>& connection);
    bool serve(Connection& connection, short events);
    bool receive(Connection& connection);
    void takeRequests(Connection& connection);
    ServerAnswer answerFor(const ServerRequest& request);
    bool advance(Connection& connection);
    void fill(Connection& connection);
    bool passGate(Connection& connection);

    Foundation::UniqueFD mListener;
    Foundation::UniqueFD mWakeUp;
    int mPort = 0;
    std::atomic<bool> mEnds = false;
    std::atomic<std::uint64_t> mSentBytes = 0;

    // Of the server's thread.
    std::vector<std::unique_ptr<Connection>> mConnections;

    mutable std::mutex mMutex;  ///< for all that follows
    std::map<std::string, Answerer> mAnswers;
    Answerer mOtherAnswers;
    std::map<std::string, std::vector<ServerAnswer>> mOnce;
    std::map<std::string, int> mGates;  ///< how many may pass
    std::map<std::string, int> mWaiting;
    std::vector<ServerRequest> mRequests;
    int mConnectionCount = 0;
    int mOpenConnections = 0;
    int mMostConnections = 0;

    std::thread mThread;
};

}  // namespace Support
