#include "FeedParser/Text/RSSAuthorParser.h"
#include "Foundation/UTF8.h"
#include "Fuzz/FuzzTarget.h"

#include <string>

using namespace Foundation;
using Orvane::RSSAuthorParser;

namespace {

/// What is found is a text without outer blanks.
std::size_t lengthOf(const String* found) {
    if (!found) return 0;
    std::string text = found->utf8();
    require(!text.empty() && UTF8::isValid(text));
    RSSAuthorParser::trim(text);
    require(text == found->view());
    return text.size();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    std::string line(reinterpret_cast<const char*>(bytes), size);
    if (!UTF8::isValid(line)) return 0;
    const Ref<String> text = String::string(std::move(line));
    const RSSAuthorParser author(text);
    require(lengthOf(author.name) + lengthOf(author.email) <= size);
    return 0;
}
