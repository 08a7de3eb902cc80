#include "Foundation/BusMatch.h"

#include <string_view>

namespace Foundation {

namespace {

/// Adds a key and its value, of which each apostrophe ends the quotes, stands for itself behind a
/// backslash, and opens them again.
void addPart(std::string& rule, const char* key, std::string_view value) {
    rule.append(",").append(key).append("='");
    for (const char c : value) {
        if (c == '\'') {
            rule += "'\\''";
        } else {
            rule += c;
        }
    }
    rule += "'";
}

void addUnlessEmpty(std::string& rule, const char* key, const std::string& value) {
    if (!value.empty()) addPart(rule, key, value);
}

bool isWanted(const std::optional<std::string>& wanted, const char* found) {
    return !wanted || (found && *wanted == found);
}

}  // namespace

std::string BusMatch::getRule() const {
    std::string rule = "type='signal'";
    addUnlessEmpty(rule, "sender", sender);
    addUnlessEmpty(rule, "path", path);
    addUnlessEmpty(rule, "interface", interface);
    addUnlessEmpty(rule, "member", member);
    if (argument0) addPart(rule, "arg0", *argument0);
    if (argument1) addPart(rule, "arg1", *argument1);
    return rule;
}

bool BusMatch::matches(const BusMessage& message) const {
    return message.isSignal(path, interface, member) &&
           isWanted(argument0, message.getStringArgument(0)) &&
           isWanted(argument1, message.getStringArgument(1));
}

}  // namespace Foundation
