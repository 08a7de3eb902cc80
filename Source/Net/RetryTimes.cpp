#include "Net/RetryTimes.h"

#include "Foundation/AtomicFile.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Net/CacheDirectives.h"
#include "Net/HTTPMessage.h"
#include "Net/ProtectionSpace.h"

#include <algorithm>
#include <cstring>
#include <fstream>
#include <sstream>

namespace Orvane {

namespace {

constexpr int kTooManyRequests = 429;
constexpr int kUnavailable = 503;

bool isOver(const RetryTimes::Refusal& refusal, double now) {
    // What lies further ahead than it can was written by a clock that was wrong.
    return refusal.until <= now || refusal.until > now + RetryTimes::kMaxSeconds;
}

}  // namespace

std::string RetryTimes::hostOf(const Foundation::URL& url) {
    const Origin origin = Origin::of(url);
    const bool isUsual = origin.port == (origin.scheme == "https" ? 443 : 80);
    return isUsual ? origin.host : origin.host + ":" + std::to_string(origin.port);
}

std::optional<double> RetryTimes::readDelay(const HTTPMessage& response, double now) {
    const std::string value = response.getHeader("Retry-After");
    if (value.empty()) return {};
    if (const auto seconds = CacheDirectives::readSeconds(value)) return seconds;
    const auto date = CacheDirectives::readDate(value);
    if (!date) return {};
    return *date - CacheDirectives::readDate(response.getHeader("Date")).value_or(now);
}

std::optional<RetryTimes::Refusal> RetryTimes::find(const Foundation::URL& url) {
    loadIfNeeded();
    const auto found = mRefusals.find(hostOf(url));
    if (found == mRefusals.end()) return {};
    if (!isOver(found->second, Foundation::Clock::current().now())) return found->second;
    mRefusals.erase(found);
    return {};
}

void RetryTimes::note(const Foundation::URL& url, const HTTPMessage& response) {
    const int status = response.getStatus();
    if (status != kTooManyRequests && status != kUnavailable) return;
    const double now = Foundation::Clock::current().now();
    const std::optional<double> asked = readDelay(response, now);
    if (!asked || *asked <= 0) return;
    const std::string host = hostOf(url);
    if (*asked > kMaxSeconds) {
        Foundation::gWarn.log("<%s>: wants to be left alone for %.0f seconds", host, *asked);
    }
    const double seconds = std::min(*asked, kMaxSeconds);
    gLogHTTP.log("%s: not asked for %.0f seconds (%d)", host, seconds, status);
    loadIfNeeded();
    mRefusals[host] = {status, now + seconds};
    prune(now);
    save();
}

void RetryTimes::prune(double now) {
    std::erase_if(mRefusals, [&](const auto& entry) { return isOver(entry.second, now); });
    while (mRefusals.size() > kMaxHosts) {
        mRefusals.erase(std::ranges::min_element(
            mRefusals, {}, [](const auto& entry) { return entry.second.until; }));
    }
}

void RetryTimes::loadIfNeeded() {
    if (mIsLoaded) return;
    mIsLoaded = true;
    mRefusals = readFile();
}

/// A line for each host: its name, the status and the time. What is no such line counts as absent.
RetryTimes::Refusals RetryTimes::readFile() const {
    Refusals refusals;
    if (mPath.empty()) return refusals;
    std::ifstream file(mPath);
    for (std::string line; std::getline(file, line) && refusals.size() < kMaxHosts;) {
        std::istringstream fields(line);
        std::string host;
        Refusal refusal{};
        if (fields >> host >> refusal.status >> refusal.until) refusals[host] = refusal;
    }
    return refusals;
}

void RetryTimes::save() {
    if (mPath.empty()) return;
    // What another process has been told holds for this one too.
    for (const auto& [host, refusal] : readFile()) {
        const auto [place, isNew] = mRefusals.try_emplace(host, refusal);
        if (!isNew && refusal.until > place->second.until) place->second = refusal;
    }
    prune(Foundation::Clock::current().now());
    std::string content;
    for (const auto& [host, refusal] : mRefusals) {
        content += OVFormat("%s %d %.0f\n", host, refusal.status, refusal.until);
    }
    const int error = Foundation::AtomicFile::write(mPath, content);
    if (error != 0) {
        Foundation::gWarn.log("Can't write \"%s\": %s", mPath, std::strerror(error));
    }
}

}  // namespace Orvane
