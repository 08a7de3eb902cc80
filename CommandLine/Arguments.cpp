#include "Arguments.h"

#include "Failure.h"
#include "Suggestion.h"

#include <algorithm>
#include <charconv>

namespace Commands {

namespace {

[[noreturn]] void complain(const std::string& text) {
    throw Failure(ExitStatus::Usage, text);
}

bool takesValue(const OptionSpec& option) {
    return option.argument[0] != 0;
}

std::string shown(const OptionSpec& option) {
    return std::string("--") + option.name;
}

const OptionSpec& findLong(const VerbSpec& spec, const std::string& name) {
    std::vector<std::string> names{"help"};
    for (const OptionSpec& option : spec.options) {
        if (option.name == name) return option;
        names.emplace_back(option.name);
    }
    const std::string close = Suggestion::closest(name, names);
    complain("there is no option --" + name +
             (close.empty() ? "" : "; did you mean --" + close + "?"));
}

const OptionSpec& findShort(const VerbSpec& spec, char letter) {
    for (const OptionSpec& option : spec.options) {
        if (option.letter == letter) return option;
    }
    complain(std::string("there is no option -") + letter);
}

std::string join(const std::vector<std::string>& words) {
    std::string all;
    for (const std::string& word : words) {
        all += (all.empty() ? "" : ", ") + word;
    }
    return all;
}

}  // namespace

Arguments::Arguments(const VerbSpec& spec, const Words& words) : mSpec(spec) {
    bool areOperands = false;
    for (std::size_t at = 0; at < words.size(); ++at) {
        const std::string& word = words[at];
        if (areOperands || word.size() < 2 || word[0] != '-') {
            mOperands.push_back(word);
        } else if (word == "--") {
            areOperands = true;
        } else if (word == "-h" || word == "--help") {
            (word == "-h" ? mWantsShortHelp : mWantsManual) = true;
            return;
        } else if (word[1] == '-') {
            takeLong(word.substr(2), words, at);
        } else {
            takeShort(word.substr(1), words, at);
        }
    }
    checkOperands();
}

void Arguments::takeLong(const std::string& word, const Words& words, std::size_t& at) {
    const std::size_t sign = word.find('=');
    const OptionSpec& option = findLong(mSpec, word.substr(0, sign));
    if (sign == std::string::npos) return takeValue(option, words, at);
    if (!takesValue(option)) complain(shown(option) + " takes no value");
    keep(option, word.substr(sign + 1));
}

void Arguments::takeShort(const std::string& word, const Words& words, std::size_t& at) {
    for (std::size_t i = 0; i < word.size(); ++i) {
        const OptionSpec& option = findShort(mSpec, word[i]);
        if (takesValue(option) && i + 1 < word.size()) return keep(option, word.substr(i + 1));
        takeValue(option, words, at);
    }
}

void Arguments::takeValue(const OptionSpec& option, const Words& words, std::size_t& at) {
    if (!takesValue(option)) return keep(option, {});
    if (at + 1 == words.size()) {
        complain(shown(option) + " needs " + option.argument + " behind it");
    }
    keep(option, words[++at]);
}

void Arguments::keep(const OptionSpec& option, const std::string& value) {
    const std::vector<std::string>& choices = option.choices;
    if (!choices.empty() && std::find(choices.begin(), choices.end(), value) == choices.end()) {
        const std::string close = Suggestion::closest(value, choices);
        complain(shown(option) + " takes one of " + join(choices) + ", not \"" + value + "\"" +
                 (close.empty() ? "" : "; did you mean " + close + "?"));
    }
    mOptions[option.name].push_back(value);
}

void Arguments::checkOperands() const {
    if (mOperands.size() < mSpec.fewest) complain(std::string(mSpec.operands) + " is missing");
    if (mOperands.size() > mSpec.most) {
        complain("\"" + mOperands[mSpec.most] + "\" is one word too many");
    }
}

std::optional<std::string> Arguments::value(const std::string& option) const {
    const auto found = mOptions.find(option);
    if (found == mOptions.end()) return std::nullopt;
    return found->second.back();
}

std::vector<std::string> Arguments::values(const std::string& option) const {
    const auto found = mOptions.find(option);
    return found == mOptions.end() ? std::vector<std::string>() : found->second;
}

std::optional<std::size_t> Arguments::number(const std::string& option) const {
    const std::optional<std::string> text = value(option);
    if (!text) return std::nullopt;
    std::size_t result = 0;
    const char* end = text->data() + text->size();
    const auto [stop, error] = std::from_chars(text->data(), end, result);
    if (error != std::errc() || stop != end) {
        complain("--" + option + " takes a whole number, not \"" + *text + "\"");
    }
    return result;
}

}  // namespace Commands
