#include "FeedParser/Text/Bounds.h"

#include "Foundation/Logger.h"

namespace Orvane::FeedParser {

void Bounds::logHit(const char* bound, std::uint64_t value) {
    gLogParser.log("A document has reached the bound \"%s\", %llu", bound, value);
}

}  // namespace Orvane::FeedParser
