#include "FeedParser/Text/TidyPipe.h"

#include "FeedParser/Text/Bounds.h"

#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <ctime>

namespace Orvane::FeedParser {

struct TidyPipe::Header {
    static constexpr std::uint32_t kMagic = 0x4F565459;

    std::uint32_t magic = kMagic;
    std::int32_t number = 0;  ///< the encoding, or the result
    std::uint32_t lengths[3] = {};
};

double TidyPipe::monotonicSeconds() {
    std::timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

TidyPipe::Outcome TidyPipe::await(short events, double deadline) const {
    constexpr double kLongestWait = 3600;
    for (;;) {
        const double left = deadline - monotonicSeconds();
        if (left <= 0) return Outcome::Late;
        pollfd wanted = {mFD, events, 0};
        const int result =
            poll(&wanted, 1, static_cast<int>(std::min(left, kLongestWait) * 1000) + 1);
        if (result > 0) return Outcome::Done;
        if (result < 0 && errno != EINTR) return Outcome::Ended;
    }
}

TidyPipe::Outcome TidyPipe::awaitInput(double deadline) const {
    return await(POLLIN, deadline);
}

TidyPipe::Outcome TidyPipe::send(std::string_view bytes, double deadline) const {
    while (!bytes.empty()) {
        const ssize_t sent = ::send(mFD, bytes.data(), bytes.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
        if (sent >= 0) {
            bytes.remove_prefix(static_cast<std::size_t>(sent));
        } else if (errno == EAGAIN) {
            const Outcome outcome = await(POLLOUT, deadline);
            if (outcome != Outcome::Done) return outcome;
        } else if (errno != EINTR) {
            return Outcome::Ended;
        }
    }
    return Outcome::Done;
}

TidyPipe::Outcome TidyPipe::receive(char* bytes, std::size_t length, double deadline) const {
    while (length > 0) {
        const ssize_t got = recv(mFD, bytes, length, MSG_DONTWAIT);
        if (got > 0) {
            bytes += got;
            length -= static_cast<std::size_t>(got);
        } else if (got < 0 && errno == EAGAIN) {
            const Outcome outcome = await(POLLIN, deadline);
            if (outcome != Outcome::Done) return outcome;
        } else if (got == 0 || errno != EINTR) {
            return Outcome::Ended;
        }
    }
    return Outcome::Done;
}

TidyPipe::Outcome TidyPipe::receiveHeader(Header& header, double deadline) const {
    const Outcome outcome = receive(reinterpret_cast<char*>(&header), sizeof header, deadline);
    if (outcome != Outcome::Done) return outcome;
    return header.magic == Header::kMagic ? Outcome::Done : Outcome::Broken;
}

TidyPipe::Outcome TidyPipe::receiveText(std::string& text, std::uint32_t length,
                                        double deadline) const {
    if (length > Bounds::kTidyBytes) return Outcome::Broken;
    text.resize(length);
    return receive(text.data(), length, deadline);
}

TidyPipe::Outcome TidyPipe::sendRequest(std::string_view className, std::int32_t encoding,
                                        std::string_view base, std::string_view markup,
                                        double deadline) const {
    Header header;
    header.number = encoding;
    header.lengths[0] = static_cast<std::uint32_t>(className.size());
    header.lengths[1] = static_cast<std::uint32_t>(base.size());
    header.lengths[2] = static_cast<std::uint32_t>(markup.size());
    std::string start(reinterpret_cast<const char*>(&header), sizeof header);
    start += className;
    start += base;
    const Outcome outcome = send(start, deadline);
    return outcome == Outcome::Done ? send(markup, deadline) : outcome;
}

TidyPipe::Outcome TidyPipe::receiveRequest(TidyRequest& request, double deadline) const {
    Header header;
    Outcome outcome = receiveHeader(header, deadline);
    request.encoding = header.number;
    std::string* const texts[] = {&request.className, &request.base, &request.markup};
    for (int i = 0; i < 3 && outcome == Outcome::Done; ++i)
        outcome = receiveText(*texts[i], header.lengths[i], deadline);
    return outcome;
}

TidyPipe::Outcome TidyPipe::sendReply(const TidyReply& reply, double deadline) const {
    Header header;
    header.number = reply.result.code;
    const std::string* const texts[] = {&reply.result.output, &reply.result.messages, &reply.log};
    for (int i = 0; i < 3; ++i)
        header.lengths[i] = static_cast<std::uint32_t>(texts[i]->size());
    Outcome outcome = send({reinterpret_cast<const char*>(&header), sizeof header}, deadline);
    for (int i = 0; i < 3 && outcome == Outcome::Done; ++i)
        outcome = send(*texts[i], deadline);
    return outcome;
}

TidyPipe::Outcome TidyPipe::receiveReply(TidyReply& reply, double deadline) const {
    Header header;
    Outcome outcome = receiveHeader(header, deadline);
    reply.result.code = header.number;
    std::string* const texts[] = {&reply.result.output, &reply.result.messages, &reply.log};
    for (int i = 0; i < 3 && outcome == Outcome::Done; ++i)
        outcome = receiveText(*texts[i], header.lengths[i], deadline);
    return outcome;
}

}  // namespace Orvane::FeedParser
