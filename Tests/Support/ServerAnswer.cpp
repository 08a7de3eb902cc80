#include "Support/ServerAnswer.h"

#include <cstdio>

namespace Support {

ServerAnswer ServerAnswer::raw(std::string bytes) {
    ServerAnswer answer;
    answer.mIsRaw = true;
    answer.mRaw = std::move(bytes);
    return answer;
}

ServerAnswer ServerAnswer::redirect(int status, std::string location) {
    ServerAnswer answer(status);
    answer.header("Location", std::move(location));
    return answer;
}

ServerAnswer& ServerAnswer::header(std::string name, std::string value) {
    mHeaders.emplace_back(std::move(name), std::move(value));
    return *this;
}

ServerAnswer& ServerAnswer::holdHead(std::string gate) {
    mHeadGate = std::move(gate);
    return *this;
}

ServerAnswer& ServerAnswer::claimLength(std::uint64_t length) {
    mClaims = true;
    mClaimed = length;
    return *this;
}

ServerAnswer& ServerAnswer::withoutLength() {
    mLength = Length::None;
    return *this;
}

ServerAnswer& ServerAnswer::chunked() {
    mLength = Length::Chunks;
    return *this;
}

ServerAnswer& ServerAnswer::body(std::string bytes, std::uint64_t times) {
    if (times == kForEver && mLength == Length::Named) mLength = Length::None;
    mSteps.push_back({ServerStep::Kind::Send, std::move(bytes), times});
    return *this;
}

ServerAnswer& ServerAnswer::wait(std::string gate) {
    mSteps.push_back({ServerStep::Kind::Wait, std::move(gate)});
    return *this;
}

ServerAnswer& ServerAnswer::reset() {
    mSteps.push_back({ServerStep::Kind::Reset, {}});
    return *this;
}

ServerAnswer& ServerAnswer::close() {
    mSteps.push_back({ServerStep::Kind::Close, {}});
    return *this;
}

std::string ServerAnswer::head(std::uint64_t length) const {
    if (mIsRaw) return mRaw;
    std::string head = "HTTP/1.1 " + std::to_string(mStatus) + " Scripted\r\n";
    for (const auto& [name, value] : mHeaders) {
        head.append(name).append(": ").append(value).append("\r\n");
    }
    const bool hasNone = (mStatus == 204 || mStatus == 304) && length == 0;
    if (mLength == Length::Chunks) head += "Transfer-Encoding: chunked\r\n";
    if (mLength == Length::None) head += "Connection: close\r\n";
    if (mClaims) {
        head += "Content-Length: " + std::to_string(mClaimed) + "\r\n";
    } else if (mLength == Length::Named && !hasNone) {
        head += "Content-Length: " + std::to_string(length) + "\r\n";
    }
    return head + "\r\n";
}

ServerStep ServerAnswer::chunk(const ServerStep& piece) const {
    if (mLength != Length::Chunks || piece.kind != ServerStep::Kind::Send) return piece;
    char size[24];
    std::snprintf(size, sizeof size, "%zx\r\n", piece.text.size());
    return {piece.kind, size + piece.text + "\r\n", piece.times};
}

std::vector<ServerStep> ServerAnswer::getSteps() const {
    std::vector<ServerStep> steps;
    std::uint64_t length = 0;
    for (const ServerStep& step : mSteps) {
        if (step.kind == ServerStep::Kind::Send) length += step.text.size() * step.times;
    }
    if (!mHeadGate.empty()) steps.push_back({ServerStep::Kind::Wait, mHeadGate});
    steps.push_back({ServerStep::Kind::Send, head(length)});
    for (const ServerStep& step : mSteps) {
        steps.push_back(chunk(step));
    }
    if (mLength == Length::Chunks) steps.push_back({ServerStep::Kind::Send, "0\r\n\r\n"});
    if (mLength == Length::None) steps.push_back({ServerStep::Kind::Close, {}});
    return steps;
}

}  // namespace Support
