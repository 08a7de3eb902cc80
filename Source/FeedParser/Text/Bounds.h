#pragma once

#include <cstddef>
#include <cstdint>

/// How much a document of a stranger's may cost. What goes beyond is cut or given up on, and the
/// bound that did it is logged.
namespace Orvane::FeedParser::Bounds {

/// How deep elements may be nested. The tags of what is deeper go, their text stays. libxml2 itself
/// gives up at 256.
inline constexpr int kElementDepth = 200;
/// How many inline elements may be open at once in HTML. Tidy repeats each of them in every block
/// that begins meanwhile, and tells about each time.
inline constexpr int kOpenInlines = 24;
/// How many messages Tidy may write about one document.
inline constexpr int kTidyReports = 100;

/// What is tidied in the process itself: markup of at most so many bytes, and of no greater depth.
inline constexpr std::size_t kInPlaceBytes = 16384;
inline constexpr int kInPlaceDepth = 32;
/// How long tidying one document may take, in seconds.
inline constexpr double kTidySeconds = 2;
/// How long its processor may work on it. The clock counts first unless the machine is busy.
inline constexpr std::uint64_t kTidyProcessorSeconds = 2;
/// The address space of the program that tidies, in bytes.
inline constexpr std::uint64_t kTidyMemory = 384ULL << 20;
/// The largest document, and the largest result, that goes through the pipe, in bytes.
inline constexpr std::size_t kTidyBytes = 64U << 20;
/// After how many seconds with nothing to do that program ends.
inline constexpr int kTidyIdleSeconds = 60;

/// Logs that a document has reached a bound.
void logHit(const char* bound, std::uint64_t value);

}  // namespace Orvane::FeedParser::Bounds
