#include "NameMatch.h"

#include "Failure.h"
#include "Suggestion.h"
#include "TextLayout.h"

#include <functional>

namespace Commands {

namespace {

using NameMatch::Named;
using Test = std::function<bool(const Named&)>;

constexpr std::size_t kMostShown = 5;

std::vector<std::size_t> select(const std::vector<Named>& things, const Test& test) {
    std::vector<std::size_t> all;
    for (std::size_t i = 0; i < things.size(); ++i) {
        if (test(things[i])) all.push_back(i);
    }
    return all;
}

/// "feeds", "entries".
std::string manyOf(const std::string& kind) {
    return kind.ends_with('y') ? kind.substr(0, kind.size() - 1) + "ies" : kind + 's';
}

[[noreturn]] void refuseAmbiguous(const std::string& name, const std::vector<Named>& things,
                                  const std::vector<std::size_t>& found, const char* kind) {
    std::string text = "\"" + name + "\" may be " + std::to_string(found.size()) + ' ' +
                       manyOf(kind) + "; name one by its identifier:";
    for (std::size_t i = 0; i < found.size() && i < kMostShown; ++i) {
        const Named& each = things[found[i]];
        text += "\n  " + each.identifier.substr(0, 12) + "  " +
                TextLayout::clean(each.title.empty() ? each.url : each.title);
    }
    if (found.size() > kMostShown) text += "\n  ...";
    throw Failure(ExitStatus::UnknownName, text);
}

[[noreturn]] void refuseUnknown(const std::string& name, const std::vector<Named>& things,
                                const char* kind) {
    std::vector<std::string> titles;
    for (const Named& each : things) {
        titles.push_back(TextLayout::clean(each.title));
    }
    const std::string close = Suggestion::closest(name, titles);
    throw Failure(ExitStatus::UnknownName,
                  std::string("there is no ") + kind + " \"" + name + '"' +
                      (close.empty() ? "; \"orvane " + manyOf(kind) + "\" lists what there is"
                                     : "; did you mean \"" + close + "\"?"));
}

}  // namespace

bool NameMatch::isPrefix(const std::string& name) {
    return name.size() >= kShortestPrefix &&
           name.find_first_not_of("0123456789abcdef") == std::string::npos;
}

std::size_t NameMatch::find(const std::string& name, const std::vector<Named>& things,
                            const char* kind) {
    const std::string folded = TextLayout::folded(name);
    const bool mayBePrefix = isPrefix(name);
    const Test tests[] = {
        [&](const Named& each) { return each.identifier == name; },
        [&](const Named& each) { return mayBePrefix && each.identifier.starts_with(name); },
        [&](const Named& each) { return each.url == name || each.url == name + '/'; },
        [&](const Named& each) { return TextLayout::folded(each.title) == folded; },
        [&](const Named& each) {
            return TextLayout::folded(each.title).find(folded) != std::string::npos;
        },
    };
    for (const Test& test : tests) {
        const std::vector<std::size_t> found = select(things, test);
        if (found.size() == 1) return found[0];
        if (found.size() > 1) refuseAmbiguous(name, things, found, kind);
    }
    refuseUnknown(name, things, kind);
}

}  // namespace Commands
