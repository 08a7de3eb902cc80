#include "HelpText.h"

#include "TextLayout.h"

#include <algorithm>
#include <utility>

namespace Commands {

namespace {

constexpr std::size_t kWidth = 78;
constexpr std::size_t kIndent = 2;

using Rows = std::vector<std::pair<std::string, std::string>>;

/// Labels with what they mean beside them.
std::string twoColumns(const Rows& rows) {
    std::size_t widest = 0;
    for (const auto& [label, text] : rows) {
        widest = std::max(widest, label.size());
    }
    const std::size_t column = kIndent + widest + 2;
    std::string all;
    for (const auto& [label, text] : rows) {
        const std::string wrapped = TextLayout::wrap(text, kWidth - column, column);
        all += std::string(kIndent, ' ') + label + std::string(widest + 2 - label.size(), ' ') +
               wrapped.substr(std::min(column, wrapped.size())) + '\n';
    }
    return all;
}

std::string options(const VerbSpec& verb) {
    Rows rows;
    for (const OptionSpec& option : verb.options) {
        rows.emplace_back(HelpText::optionLabel(option), option.help);
    }
    rows.emplace_back("-h, --help", "Show this; --help shows the whole manual");
    return "Options:\n" + twoColumns(rows);
}

std::string verbList(const std::vector<const VerbSpec*>& verbs) {
    Rows rows;
    for (const VerbSpec* verb : verbs) {
        rows.emplace_back(verb->name, verb->summary);
    }
    return "Verbs:\n" + twoColumns(rows);
}

std::string paragraphs(const std::string& text) {
    std::string all;
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t end = std::min(text.find("\n\n", at), text.size());
        all += TextLayout::wrap(text.substr(at, end - at), kWidth, 0) + "\n\n";
        at = end + 2;
    }
    return all;
}

std::string exitCodes() {
    Rows rows;
    for (const char* meaning : HelpText::kExitCodes) {
        rows.emplace_back(std::to_string(rows.size()), meaning);
    }
    return "Exit status:\n" + twoColumns(rows);
}

}  // namespace

std::string HelpText::optionLabel(const OptionSpec& option) {
    std::string label = option.letter ? std::string("-") + option.letter + ", " : "";
    label += std::string("--") + option.name;
    if (option.argument[0]) label += std::string(" ") + option.argument;
    return label;
}

std::string HelpText::usage(const VerbSpec& verb) {
    std::string line = std::string("orvane ") + verb.name;
    if (!verb.options.empty()) line += " [OPTION...]";
    if (verb.operands[0]) line += std::string(" ") + verb.operands;
    return line;
}

std::string HelpText::program(const std::vector<const VerbSpec*>& verbs) {
    return "Feeds, from the command line.\n\nUsage: orvane VERB [OPTION...] [ARGUMENT...]\n\n" +
           verbList(verbs) +
           "\n\"orvane VERB -h\" tells the options of a verb, \"orvane --help\" all the rest.\n";
}

std::string HelpText::programManual(const std::vector<const VerbSpec*>& verbs) {
    return "Feeds, from the command line.\n\nUsage: orvane VERB [OPTION...] [ARGUMENT...]\n\n" +
           verbList(verbs) + '\n' + paragraphs(generalDetails()) + exitCodes();
}

std::string HelpText::verb(const VerbSpec& verb) {
    return "Usage: " + usage(verb) + "\n\n" + TextLayout::capitalised(verb.summary) + ".\n\n" +
           options(verb);
}

std::string HelpText::verbManual(const VerbSpec& verb) {
    std::string text = HelpText::verb(verb) + '\n' + paragraphs(verb.details);
    if (!verb.examples.empty()) {
        text += "Examples:\n";
        for (const std::string& example : verb.examples) {
            text += "  orvane " + example + '\n';
        }
        text += '\n';
    }
    return text + exitCodes();
}

const char* HelpText::generalDetails() {
    return "A feed is named by its identifier or the first 7 or more characters of it, by its URL, "
           "or "
           "by a part of its title that no other feed has. Entries are named in the same way.\n\n"
           "Data goes to standard output, words go to standard error. On a terminal, data is a "
           "table "
           "with dates as people say them, fitted to the width. In a pipe it is a line for each "
           "thing, with tabs in between, whole identifiers, and dates of ISO 8601 in UTC. --json "
           "gives one JSON document, in which \"schema\" is 1, and --jsonl one JSON object a "
           "line.\n\n"
           "orvane acts for the application com.tarnwick.Brisko, so that what it subscribes to is "
           "what the pages of the browser show; --client takes another one. Verbs that change "
           "something start the agent, orvane-agent, if it does not run.\n\n"
           "The environment variable NO_COLOR turns colours off, COLUMNS sets the width of tables, "
           "and PAGER names the program that long texts are shown with.\n\n";
}

}  // namespace Commands
