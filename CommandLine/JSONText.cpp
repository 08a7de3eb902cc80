#include "JSONText.h"

#include <string_view>
#include <utility>

namespace Commands {

void JSONText::escapeLineEnds(std::string& json) {
    constexpr std::pair<std::string_view, std::string_view> kLineEnds[] = {
        {"\u0085", "\\u0085"}, {"\u2028", "\\u2028"}, {"\u2029", "\\u2029"}};
    for (const auto& [character, escape] : kLineEnds) {
        for (std::size_t at = json.find(character); at != std::string::npos;
             at = json.find(character, at + escape.size())) {
            json.replace(at, character.size(), escape);
        }
    }
}

}  // namespace Commands
