#include "Completion.h"

namespace Commands {

namespace {

using Verbs = std::vector<const VerbSpec*>;

/// Asks for identifiers; nothing is started only because somebody has pressed a key.
constexpr const char* kHasDatabase =
    "[ -f \"${XDG_DATA_HOME:-$HOME/.local/share}/Orvane/Database/Database.sqlite3\" ]";
constexpr const char* kFeedsCommand = "orvane feeds 2>/dev/null";
constexpr const char* kEntriesCommand =
    "orvane entries -n 200 --format '{id}\\t{title}' 2>/dev/null";

std::string joined(const std::vector<std::string>& words) {
    std::string all;
    for (const std::string& word : words) {
        all += (all.empty() ? "" : " ") + word;
    }
    return all;
}

std::string namesOf(const Verbs& verbs) {
    std::vector<std::string> names;
    for (const VerbSpec* verb : verbs) {
        names.emplace_back(verb->name);
    }
    return joined(names);
}

std::string optionsOf(const VerbSpec& verb) {
    std::vector<std::string> names;
    for (const OptionSpec& option : verb.options) {
        names.push_back(std::string("--") + option.name);
    }
    names.emplace_back("--help");
    return joined(names);
}

/// A text between quotation marks of a shell.
std::string quoted(const std::string& text) {
    std::string result = "'";
    for (const char c : text) {
        if (c == '\'') {
            result += "'\\''";
        } else {
            result += c;
        }
    }
    return result + '\'';
}

std::string bashWords(WordKind kind, const std::vector<std::string>& choices) {
    switch (kind) {
        case WordKind::File:
            return "COMPREPLY=($(compgen -f -- \"$cur\"))";
        case WordKind::Feed:
            return "_orvane_words \"$(_orvane_feeds)\"";
        case WordKind::Entry:
            return "_orvane_words \"$(_orvane_entries)\"";
        case WordKind::Choice:
            return "_orvane_words '" + joined(choices) + '\'';
        case WordKind::Free:
            break;
    }
    return ":";
}

std::string bashVerb(const VerbSpec& verb) {
    std::string text;
    for (const OptionSpec& option : verb.options) {
        if (!option.argument[0]) continue;
        text += std::string("        ") + verb.name + ":--" + option.name;
        if (option.letter) text += std::string("|") + verb.name + ":-" + option.letter;
        text += ") " + bashWords(option.kind, option.choices) + "; return ;;\n";
    }
    return text;
}

constexpr const char* kBashHead =
    "# Completion of the words of orvane for bash.\n\n"
    "_orvane_words() { COMPREPLY=($(compgen -W \"$1\" -- \"$cur\")); }\n";

/// "_arguments" of zsh takes these signs for its own.
std::string zshText(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '[' || c == ']' || c == ':' || c == '\\') result += '\\';
        result += c;
    }
    return result;
}

std::string zshAction(WordKind kind, const std::vector<std::string>& choices) {
    switch (kind) {
        case WordKind::File:
            return "_files";
        case WordKind::Feed:
            return "_orvane_feeds";
        case WordKind::Entry:
            return "_orvane_entries";
        case WordKind::Choice:
            return '(' + joined(choices) + ')';
        case WordKind::Free:
            break;
    }
    return " ";
}

std::string zshOption(const OptionSpec& option) {
    const std::string value = option.argument[0] ? ":" + zshText(option.argument) + ':' +
                                                       zshAction(option.kind, option.choices)
                                                 : "";
    const std::string rest = '[' + zshText(option.help) + ']' + value;
    std::string text = quoted(std::string("*--") + option.name + rest);
    if (option.letter) text += ' ' + quoted(std::string("*-") + option.letter + rest);
    return text;
}

std::string zshVerb(const VerbSpec& verb) {
    std::string text = std::string("        ") + verb.name + ")\n            _arguments";
    for (const OptionSpec& option : verb.options) {
        text += " \\\n                " + zshOption(option);
    }
    text += " \\\n                '--help[Show the manual]'";
    if (!verb.choices.empty()) {
        text +=
            " \\\n                " + quoted("1:word:" + zshAction(WordKind::Choice, verb.choices));
    }
    if (verb.most > 0 && verb.kind != WordKind::Choice) {
        text += " \\\n                " + quoted("*:word:" + zshAction(verb.kind, {}));
    }
    return text + " ;;\n";
}

std::string fishWords(WordKind kind, const std::vector<std::string>& choices) {
    switch (kind) {
        case WordKind::File:
            return " -F";
        case WordKind::Feed:
            return " -a '(__orvane_feeds)'";
        case WordKind::Entry:
            return " -a '(__orvane_entries)'";
        case WordKind::Choice:
            return " -a '" + joined(choices) + '\'';
        case WordKind::Free:
            break;
    }
    return {};
}

/// Between quotation marks of fish, which escapes them with a backslash.
std::string fishQuoted(const std::string& text) {
    std::string result = "'";
    for (const char c : text) {
        if (c == '\'' || c == '\\') result += '\\';
        result += c;
    }
    return result + '\'';
}

std::string fishVerb(const VerbSpec& verb) {
    const std::string begin =
        std::string("complete -c orvane -n '__fish_seen_subcommand_from ") + verb.name + '\'';
    std::string text;
    for (const OptionSpec& option : verb.options) {
        text += begin + " -l " + option.name;
        if (option.letter) text += std::string(" -s ") + option.letter;
        if (option.argument[0]) text += " -r" + fishWords(option.kind, option.choices);
        text += " -d " + fishQuoted(option.help) + '\n';
    }
    if (!verb.choices.empty()) text += begin + fishWords(WordKind::Choice, verb.choices) + '\n';
    if (verb.kind == WordKind::Choice) return text;
    const std::string words = fishWords(verb.kind, {});
    return words.empty() ? text : text + begin + words + '\n';
}

}  // namespace

std::string Completion::bash(const Verbs& verbs) {
    std::string text = kBashHead;
    text += std::string("_orvane_feeds() { ") + kHasDatabase + " && " + kFeedsCommand +
            " | cut -f 1; }\n_orvane_entries() { " + kHasDatabase + " && " + kEntriesCommand +
            " | cut -f 1; }\n\n_orvane() {\n"
            "    local cur=${COMP_WORDS[COMP_CWORD]} prev=${COMP_WORDS[COMP_CWORD - 1]}\n"
            "    COMPREPLY=()\n"
            "    if [ \"$COMP_CWORD\" = 1 ]; then\n"
            "        _orvane_words '" +
            namesOf(verbs) +
            "'\n        return\n    fi\n"
            "    case ${COMP_WORDS[1]}:$prev in\n";
    for (const VerbSpec* verb : verbs) {
        text += bashVerb(*verb);
    }
    // The first word of some verbs is one of a few, whatever the others are.
    for (const VerbSpec* verb : verbs) {
        if (verb->choices.empty()) continue;
        text += std::string("        ") + verb->name + ':' + verb->name + ") " +
                bashWords(WordKind::Choice, verb->choices) + "; return ;;\n";
    }
    text += "    esac\n    case ${COMP_WORDS[1]}:$cur in\n";
    for (const VerbSpec* verb : verbs) {
        text += std::string("        ") + verb->name + ":-*) _orvane_words '" + optionsOf(*verb) +
                "' ;;\n        " + verb->name + ":*) " + bashWords(verb->kind, verb->choices) +
                " ;;\n";
    }
    return text + "    esac\n}\n\ncomplete -F _orvane orvane\n";
}

std::string Completion::zsh(const Verbs& verbs) {
    std::string text =
        "#compdef orvane\n# Completion of the words of orvane for zsh.\n\n"
        "_orvane_described() {\n    local -a found\n    local id title\n"
        "    while IFS=$'\\t' read -r id title; do found+=(\"$id:$title\"); done\n"
        "    _describe \"$1\" found\n}\n";
    text += std::string("_orvane_feeds() { ") + kHasDatabase + " && " + kFeedsCommand +
            " | cut -f 1,3 | _orvane_described feed }\n_orvane_entries() { " + kHasDatabase +
            " && " + kEntriesCommand +
            " | _orvane_described entry }\n\n_orvane() {\n    local -a verbs\n    verbs=(\n";
    for (const VerbSpec* verb : verbs) {
        text += "        " + quoted(verb->name + (':' + zshText(verb->summary))) + '\n';
    }
    text +=
        "    )\n    if (( CURRENT == 2 )); then\n        _describe verb verbs\n        return\n"
        "    fi\n    shift words\n    (( CURRENT-- ))\n    case $words[1] in\n";
    for (const VerbSpec* verb : verbs) {
        text += zshVerb(*verb);
    }
    return text + "    esac\n}\n\ncompdef _orvane orvane\n";
}

std::string Completion::fish(const Verbs& verbs) {
    std::string text =
        "# Completion of the words of orvane for fish.\n\n"
        "function __orvane_has_database\n    set -l data $XDG_DATA_HOME\n"
        "    test -n \"$data\"; or set data ~/.local/share\n"
        "    test -f $data/Orvane/Database/Database.sqlite3\nend\n\n"
        "function __orvane_feeds\n    __orvane_has_database; and " +
        std::string(kFeedsCommand) +
        " | cut -f 1,3\nend\n\nfunction __orvane_entries\n    __orvane_has_database; and " +
        kEntriesCommand + "\nend\n\ncomplete -c orvane -f\n";
    for (const VerbSpec* verb : verbs) {
        text += std::string("complete -c orvane -n __fish_use_subcommand -a ") + verb->name +
                " -d " + fishQuoted(verb->summary) + '\n';
    }
    for (const VerbSpec* verb : verbs) {
        text += fishVerb(*verb);
    }
    return text;
}

}  // namespace Commands
