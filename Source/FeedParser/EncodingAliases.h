#pragma once

namespace Orvane::FeedParser {

/// Teaches libxml2 other ways to write the names of encodings, for the process. Once is enough.
void registerEncodingAliases();

}  // namespace Orvane::FeedParser
