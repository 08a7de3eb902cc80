#include "Net/SuggestedFilename.h"

#include "Foundation/StringEncoding.h"
#include "Foundation/URLCharacters.h"
#include "Net/ConnectionResponse.h"
#include "Utilities/SafeFileName.h"

#include <algorithm>
#include <optional>

namespace Orvane {

using Foundation::Ref;
using Foundation::String;

namespace {

constexpr const char* kNameless = "download";

/// Takes the next parameter off a list: its name, and its value without quotation marks.
std::pair<std::string, std::string> takeParameter(std::string_view& list) {
    std::pair<std::string, std::string> parameter;
    bool isValue = false;
    bool isQuoted = false;
    std::size_t i = 0;
    for (; i < list.size() && (isQuoted || list[i] != ';'); ++i) {
        if (isQuoted && list[i] == '\\' && i + 1 < list.size()) {
            parameter.second += list[++i];
        } else if (list[i] == '"') {
            isQuoted = !isQuoted;
        } else if (list[i] == '=' && !isValue) {
            isValue = true;
        } else if (isQuoted || (list[i] != ' ' && list[i] != '\t')) {
            (isValue ? parameter.second : parameter.first) += list[i];
        }
    }
    list.remove_prefix(std::min(i + 1, list.size()));
    return parameter;
}

/// The text of "charset'language'escaped text"; empty if it can't be read.
std::string readExtended(std::string_view value) {
    const std::size_t charsetEnd = std::min(value.find('\''), value.size());
    const std::size_t languageEnd = value.find('\'', charsetEnd + 1);
    if (charsetEnd == value.size() || languageEnd == std::string_view::npos) return {};
    const std::string charset(value.substr(0, charsetEnd));
    const auto encoding = Foundation::StringEncoding::named(charset.c_str());
    const auto bytes = Foundation::unescapeURLText(value.substr(languageEnd + 1));
    if (!encoding || !bytes) return {};
    return encoding->decode(*bytes).value_or("");
}

}  // namespace

std::string headerParameter(std::string_view header, std::string_view name) {
    std::string plain;
    std::string extended;
    header.remove_prefix(std::min(header.find(';'), header.size()));
    while (!header.empty()) {
        const auto [itsName, value] = takeParameter(header);
        if (HTTPMessage::isSameName(itsName, name)) plain = value;
        if (HTTPMessage::isSameName(itsName, std::string(name) + "*")) {
            extended = readExtended(value);
        }
    }
    return extended.empty() ? plain : extended;
}

Foundation::StringReturner suggestedFilename(const ConnectionResponse& response) {
    const std::string disposition = response.getHTTPMessage()->getHeader("Content-Disposition");
    std::string name = SafeFileName::make(headerParameter(disposition, "filename"));
    if (name.empty()) {
        const Ref<String> last = response.getURL()->getLastPathComponent();
        name = SafeFileName::make(String::view(last));
    }
    return String::stringOfUTF8(name.empty() ? kNameless : name);
}

}  // namespace Orvane
