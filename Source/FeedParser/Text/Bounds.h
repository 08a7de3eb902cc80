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
/// How many of them Tidy may repeat so in one piece of markup. Those that are open then end.
inline constexpr int kRepeatedInlines = 3000;
/// How many attributes of a broken element are kept. Tidy compares each with all others.
inline constexpr int kMendedAttributes = 200;
/// How many messages Tidy may write about one document.
inline constexpr int kTidyReports = 100;

/// What is tidied in the process itself: markup of at most so many bytes, and of no greater depth.
inline constexpr std::size_t kInPlaceBytes = 16384;
inline constexpr int kInPlaceDepth = 32;
/// How long tidying one document may take, in seconds, and how long the processor may work on it.
/// The clock comes first, as long as somebody waits.
inline constexpr double kTidySeconds = 2;
inline constexpr std::uint64_t kTidyProcessorSeconds = 3;
/// The address space of the program that tidies, in bytes.
inline constexpr std::uint64_t kTidyMemory = 320ULL << 20;
/// The largest document that it is given, and the largest result that is taken from it, in bytes.
inline constexpr std::size_t kTidyBytes = 64U << 20;
/// After how many seconds with nothing to do it ends.
inline constexpr double kTidyIdleSeconds = 60;
/// How long it may take to start, in seconds.
inline constexpr double kTidyStartSeconds = 10;

/// After how many errors in a document libxml2 is stopped. There are documents for which it would
/// never end.
inline constexpr int kParserErrors = 1000;
/// How many tags a document may have. Each is an element or an end of one, which cost a hundred
/// times what the shortest of them takes in the document.
inline constexpr std::size_t kTags = 1000000;
/// How many attributes a tag may have. libxml2 compares each with all others.
inline constexpr std::size_t kAttributes = 1000;
/// How long the declarations in a DOCTYPE may be, in bytes, and how many "%" there may be in them.
inline constexpr std::size_t kSubsetBytes = 65536;
inline constexpr std::size_t kSubsetPercents = 32;
/// How many bytes of attributes such declarations may give to all elements together, at most.
inline constexpr std::size_t kDefaultAttributeBytes = 8U << 20;
/// How many bytes the entities in all attributes may come to.
inline constexpr std::size_t kEntityBytes = 262144;
/// How many bytes of XML the elements of a document may get, one within the other, for each byte of
/// the document, and how many at least.
inline constexpr std::size_t kRawXMLFactor = 16;
inline constexpr std::size_t kRawXMLBytes = 1U << 20;
/// How many entries a document may have, an entry enclosures, and a page statements of its base.
inline constexpr std::size_t kEntries = 10000;
inline constexpr std::size_t kEnclosures = 1000;
inline constexpr int kPageBases = 100;
/// The longest URL that others count as relative to, in bytes: each of them becomes that long.
inline constexpr std::size_t kBaseURLBytes = 2048;
/// How long the processor may work on parsing a document, in seconds: as such, and for each MiB.
inline constexpr double kParseSeconds = 0.5;
inline constexpr double kParseSecondsPerMiB = 0.25;

/// Logs that a document has reached a bound.
void logHit(const char* bound, std::uint64_t value);

}  // namespace Orvane::FeedParser::Bounds
