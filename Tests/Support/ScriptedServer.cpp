#include "Support/ScriptedServer.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <deque>
#include <sstream>
#include <stdexcept>

namespace Support {

using Foundation::UniqueFD;

namespace {

using Lock = std::lock_guard<std::mutex>;

/// What is put into the buffer of a connection at once, if pieces are smaller.
constexpr std::size_t kMostBuffered = 65536;

std::string lowered(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

ServerRequest parse(const std::string& head) {
    ServerRequest request;
    std::istringstream lines(head);
    lines >> request.method >> request.target;
    std::string line;
    std::getline(lines, line);
    while (std::getline(lines, line) && line.size() > 1) {
        line.pop_back();
        const std::size_t colon = line.find(':');
        if (colon == std::string::npos) continue;
        const std::size_t value = line.find_first_not_of(' ', colon + 1);
        request.headers[lowered(line.substr(0, colon))] =
            value == std::string::npos ? "" : line.substr(value);
    }
    return request;
}

/// Makes the end of a connection a reset.
void resetOnClose(int fd) {
    const linger now{1, 0};
    setsockopt(fd, SOL_SOCKET, SO_LINGER, &now, sizeof now);
}

}  // namespace

struct ScriptedServer::Connection {
    UniqueFD fd;
    int number = 0;
    std::string input;
    std::string output;            ///< what waits to be written
    std::deque<ServerStep> steps;  ///< what is still to be done
    bool isWaiting = false;        ///< at a gate
};

std::string ServerRequest::header(const std::string& name) const {
    const auto found = headers.find(name);
    return found == headers.end() ? "" : found->second;
}

ScriptedServer::ScriptedServer()
    : mListener(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0)),
      mWakeUp(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    auto* generic = reinterpret_cast<sockaddr*>(&address);
    if (bind(mListener.get(), generic, size) != 0 || listen(mListener.get(), 1024) != 0 ||
        getsockname(mListener.get(), generic, &size) != 0) {
        throw std::runtime_error("cannot listen on the loopback device");
    }
    mPort = ntohs(address.sin_port);
    mThread = std::thread([this] { run(); });
}

ScriptedServer::~ScriptedServer() {
    mEnds = true;
    wake();
    mThread.join();
}

std::string ScriptedServer::url(const std::string& path, const std::string& host) const {
    return "http://" + host + ":" + std::to_string(mPort) + path;
}

void ScriptedServer::answer(const std::string& path, ServerAnswer answer) {
    answerBy(path, [answer = std::move(answer)](const ServerRequest&) { return answer; });
}

void ScriptedServer::answerBy(const std::string& path, Answerer answerer) {
    const Lock lock(mMutex);
    mAnswers[path] = std::move(answerer);
}

void ScriptedServer::answerOthersBy(Answerer answerer) {
    const Lock lock(mMutex);
    mOtherAnswers = std::move(answerer);
}

void ScriptedServer::answerOnce(const std::string& path, ServerAnswer answer) {
    const Lock lock(mMutex);
    mOnce[path].push_back(std::move(answer));
}

void ScriptedServer::letThrough(const std::string& gate, int times) {
    {
        const Lock lock(mMutex);
        mGates[gate] += times;
    }
    wake();
}

std::vector<ServerRequest> ScriptedServer::getRequests() const {
    const Lock lock(mMutex);
    return mRequests;
}

std::vector<ServerRequest> ScriptedServer::getRequests(const std::string& path) const {
    std::vector<ServerRequest> requests = getRequests();
    std::erase_if(requests, [&](const ServerRequest& request) { return request.path() != path; });
    return requests;
}

int ScriptedServer::getRequestCount() const {
    const Lock lock(mMutex);
    return static_cast<int>(mRequests.size());
}

int ScriptedServer::getRequestCount(const std::string& path) const {
    return static_cast<int>(getRequests(path).size());
}

int ScriptedServer::getConnectionCount() const {
    const Lock lock(mMutex);
    return mConnectionCount;
}

int ScriptedServer::getOpenConnectionCount() const {
    const Lock lock(mMutex);
    return mOpenConnections;
}

int ScriptedServer::getMostConnections() const {
    const Lock lock(mMutex);
    return mMostConnections;
}

int ScriptedServer::getWaitingCount(const std::string& gate) const {
    const Lock lock(mMutex);
    const auto found = mWaiting.find(gate);
    return found == mWaiting.end() ? 0 : found->second;
}

void ScriptedServer::forgetRequests() {
    const Lock lock(mMutex);
    mRequests.clear();
}

void ScriptedServer::wake() {
    const std::uint64_t one = 1;
    // It fails only when it is full, and then the thread wakes all the same.
    static_cast<void>(!write(mWakeUp.get(), &one, sizeof one));
}

void ScriptedServer::run() {
    while (!mEnds) {
        std::vector<pollfd> polled{{mWakeUp.get(), POLLIN, 0}, {mListener.get(), POLLIN, 0}};
        for (const auto& connection : mConnections) {
            const int writes = connection->output.empty() ? 0 : POLLOUT;
            polled.push_back({connection->fd.get(), static_cast<short>(POLLIN | writes), 0});
        }
        if (poll(polled.data(), polled.size(), -1) < 0) continue;
        std::uint64_t wakings;
        static_cast<void>(!read(mWakeUp.get(), &wakings, sizeof wakings));
        const std::size_t count = mConnections.size();
        for (std::size_t i = 0; i < count; ++i) {
            if (!serve(*mConnections[i], polled[i + 2].revents)) drop(mConnections[i]);
        }
        std::erase(mConnections, nullptr);
        if (polled[1].revents != 0) accept();
        const Lock lock(mMutex);
        mOpenConnections = static_cast<int>(mConnections.size());
        mMostConnections = std::max(mMostConnections, mOpenConnections);
    }
}

void ScriptedServer::accept() {
    for (;;) {
        UniqueFD fd(accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK));
        if (!fd) return;
        const int on = 1;
        setsockopt(fd.get(), IPPROTO_TCP, TCP_NODELAY, &on, sizeof on);
        auto connection = std::make_unique<Connection>();
        connection->fd = std::move(fd);
        {
            const Lock lock(mMutex);
            connection->number = ++mConnectionCount;
        }
        mConnections.push_back(std::move(connection));
    }
}

void ScriptedServer::drop(std::unique_ptr<Connection>& connection) {
    if (connection->isWaiting) {
        const Lock lock(mMutex);
        --mWaiting[connection->steps.front().text];
    }
    connection = nullptr;
}

bool ScriptedServer::serve(Connection& connection, short events) {
    if ((events & (POLLERR | POLLNVAL)) != 0) return false;
    if ((events & (POLLIN | POLLHUP)) != 0 && !receive(connection)) return false;
    takeRequests(connection);
    return advance(connection);
}

/// Whether the connection goes on.
bool ScriptedServer::receive(Connection& connection) {
    char buffer[16384];
    for (;;) {
        const ssize_t n = read(connection.fd.get(), buffer, sizeof buffer);
        if (n < 0) return errno == EAGAIN || errno == EINTR;
        if (n == 0) return false;
        connection.input.append(buffer, static_cast<std::size_t>(n));
    }
}

void ScriptedServer::takeRequests(Connection& connection) {
    // One after the other: a request is taken up when the one before it is answered.
    if (!connection.steps.empty() || !connection.output.empty()) return;
    const std::size_t end = connection.input.find("\r\n\r\n");
    if (end == std::string::npos) return;
    ServerRequest request = parse(connection.input.substr(0, end + 4));
    connection.input.erase(0, end + 4);
    request.connection = connection.number;
    const std::vector<ServerStep> steps = answerFor(request).getSteps();
    connection.steps.assign(steps.begin(), steps.end());
}

ServerAnswer ScriptedServer::answerFor(const ServerRequest& request) {
    const Lock lock(mMutex);
    mRequests.push_back(request);
    std::vector<ServerAnswer>& once = mOnce[request.path()];
    if (!once.empty()) {
        ServerAnswer answer = std::move(once.front());
        once.erase(once.begin());
        return answer;
    }
    const auto found = mAnswers.find(request.path());
    if (found != mAnswers.end()) return found->second(request);
    return mOtherAnswers ? mOtherAnswers(request) : ServerAnswer(404);
}

/// Does what can be done now. Whether the connection goes on.
bool ScriptedServer::advance(Connection& connection) {
    for (;;) {
        while (!connection.output.empty()) {
            const ssize_t n = ::send(connection.fd.get(), connection.output.data(),
                                     connection.output.size(), MSG_NOSIGNAL);
            if (n < 0) return errno == EAGAIN || errno == EINTR;
            mSentBytes += static_cast<std::uint64_t>(n);
            connection.output.erase(0, static_cast<std::size_t>(n));
        }
        if (connection.steps.empty()) {
            takeRequests(connection);
            if (connection.steps.empty()) return true;
        }
        const ServerStep::Kind kind = connection.steps.front().kind;
        if (kind == ServerStep::Kind::Close) return false;
        if (kind == ServerStep::Kind::Reset) {
            resetOnClose(connection.fd.get());
            return false;
        }
        if (kind == ServerStep::Kind::Wait) {
            if (!passGate(connection)) return true;
        } else {
            fill(connection);
        }
    }
}

/// Puts the next piece into the output, or as many of its repetitions as are sent at once.
void ScriptedServer::fill(Connection& connection) {
    ServerStep& step = connection.steps.front();
    do {
        connection.output += step.text;
        if (step.times != ServerAnswer::kForEver) --step.times;
    } while (step.times > 0 && !step.text.empty() && connection.output.size() < kMostBuffered);
    if (step.times == 0 || step.text.empty()) connection.steps.pop_front();
}

bool ScriptedServer::passGate(Connection& connection) {
    const Lock lock(mMutex);
    const std::string& gate = connection.steps.front().text;
    int& waiting = mWaiting[gate];
    if (!connection.isWaiting) ++waiting;
    connection.isWaiting = true;
    int& allowed = mGates[gate];
    if (allowed == 0) return false;
    --allowed;
    --waiting;
    connection.isWaiting = false;
    connection.steps.pop_front();
    return true;
}

}  // namespace Support
