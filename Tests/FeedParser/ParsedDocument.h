#pragma once

#include "FeedParser/Parser.h"

#include <nlohmann/json_fwd.hpp>

#include <string>

/// What a parser made of a document, in the words of the corpus: "kind", "format", "attempts",
/// "tidiedWith", "feed", "entries", "info", "page", "friend". What is not there is null; dates are
/// "2005-10-21T00:12:34Z".
nlohmann::json describe(const Orvane::FeedParser::Parser& parser);

/// Parses a text, and describes what came of it.
nlohmann::json parsed(const std::string& document, const char* url = nullptr);

/// What stands at a path such as "entries[0].author.name", "entries.count" or
/// "entries[0].content.mimeType". Null if there is nothing.
nlohmann::json valueAt(const nlohmann::json& description, const std::string& path);

/// The words of a text with markup: without tags, escapes undone twice, one space for each run of
/// white space.
std::string wordsOf(const std::string& text);
