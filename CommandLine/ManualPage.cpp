#include "ManualPage.h"

#include "HelpText.h"
#include "TextLayout.h"

#include <glib.h>

#include <algorithm>
#include <sstream>

namespace Commands {

namespace {

constexpr const char* kDate = "November 21, 2026";
constexpr std::size_t kWidth = 76;

/// What roff would take for its own.
std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '\\') {
            result += "\\e";
        } else if (c == '~') {
            result += "\\(ti";
        } else {
            result += c;
        }
    }
    return result;
}

/// No line of a text is a request.
std::string guarded(const std::string& lines) {
    std::istringstream stream(lines);
    std::string result;
    for (std::string line; std::getline(stream, line);) {
        if (line.starts_with('.') || line.starts_with('\'')) result += "\\&";
        result += line + '\n';
    }
    return result;
}

/// A paragraph with each sentence on lines of its own, as roff wants them.
std::string sentences(const std::string& text) {
    std::istringstream words(text);
    std::string sentence;
    std::string result;
    for (std::string word; words >> word;) {
        sentence += (sentence.empty() ? "" : " ") + word;
        if (!word.ends_with('.') && !word.ends_with(".)")) continue;
        result += TextLayout::wrap(sentence, kWidth, 0) + '\n';
        sentence.clear();
    }
    if (!sentence.empty()) result += TextLayout::wrap(sentence, kWidth, 0) + '\n';
    return guarded(escaped(result));
}

std::string paragraphs(const std::string& text) {
    std::string result;
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t end = std::min(text.find("\n\n", at), text.size());
        const std::string paragraph = sentences(text.substr(at, end - at));
        if (!paragraph.empty()) result += (result.empty() ? "" : ".Pp\n") + paragraph;
        at = end + 2;
    }
    return result;
}

std::string upperCase(const std::string& text) {
    std::string result = text;
    for (char& c : result) {
        c = g_ascii_toupper(c);
    }
    return result;
}

std::string head(const std::string& name, const std::string& summary) {
    return ".Dd " + std::string(kDate) + "\n.Dt " + upperCase(name) + " 1\n.Os\n.Sh NAME\n.Nm " +
           name + "\n.Nd " + summary + '\n';
}

/// "FILE|-" and the like, with what may be repeated.
std::string operand(const std::string& word) {
    std::string text = word;
    const bool isOptional = text.starts_with('[');
    std::erase(text, '[');
    std::erase(text, ']');
    const std::size_t dots = text.find("...");
    if (dots != std::string::npos) text = text.substr(0, dots) + " ...";
    return (isOptional ? ".Op Ar " : ".Ar ") + text + '\n';
}

std::string synopsis(const VerbSpec& verb) {
    std::string text = std::string(".Sh SYNOPSIS\n.Nm orvane\n.Cm ") + verb.name + '\n';
    if (!verb.options.empty()) text += ".Op Ar OPTION ...\n";
    const std::string operands = verb.operands;
    if (operands.empty()) return text;
    // Words in brackets stay together.
    const std::size_t bracket = operands.find('[');
    const std::string first = operands.substr(0, bracket);
    if (!first.empty()) text += operand(first.substr(0, first.find_last_not_of(' ') + 1));
    if (bracket != std::string::npos) text += operand(operands.substr(bracket));
    return text;
}

std::string option(const OptionSpec& option) {
    std::string text = ".It ";
    if (option.letter) text += std::string("Fl ") + option.letter + " , ";
    text += std::string("Fl Fl ") + option.name;
    if (option.argument[0]) text += std::string(" Ar ") + option.argument;
    return text + '\n' + sentences(std::string(option.help) + '.');
}

std::string options(const VerbSpec& verb) {
    if (verb.options.empty()) return {};
    std::string text = ".Pp\nThe options are as follows:\n.Bl -tag -width Ds\n";
    for (const OptionSpec& each : verb.options) {
        text += option(each);
    }
    return text + ".El\n";
}

std::string exitStatus() {
    std::string text = ".Sh EXIT STATUS\n.Bl -tag -width Ds -compact\n";
    int number = 0;
    for (const char* meaning : HelpText::kExitCodes) {
        text += ".It " + std::to_string(number++) + '\n' + TextLayout::capitalised(meaning) + ".\n";
    }
    return text + ".El\n";
}

std::string examples(const VerbSpec& verb) {
    if (verb.examples.empty()) return {};
    std::string text = ".Sh EXAMPLES\n.Bd -literal\n";
    for (const std::string& example : verb.examples) {
        text += "orvane " + escaped(example) + '\n';
    }
    return text + ".Ed\n";
}

/// The pages of all verbs and of the agent, in the order of the alphabet.
std::string seeAlso(const std::vector<const VerbSpec*>& verbs) {
    std::vector<std::string> names{"orvane-agent"};
    for (const VerbSpec* each : verbs) {
        names.push_back(std::string("orvane-") + each->name);
    }
    std::sort(names.begin(), names.end());
    std::string text;
    for (const std::string& name : names) {
        text += ".Xr " + name + " 1" + (name == names.back() ? "\n" : " ,\n");
    }
    return text;
}

}  // namespace

std::string ManualPage::program(const std::vector<const VerbSpec*>& verbs) {
    std::string text = head("orvane", "feeds, from the command line");
    text +=
        ".Sh SYNOPSIS\n.Nm\n.Ar VERB\n.Op Ar OPTION ...\n.Op Ar ARGUMENT ...\n"
        ".Sh DESCRIPTION\nThe verbs are as follows:\n.Bl -tag -width completion\n";
    for (const VerbSpec* each : verbs) {
        text += std::string(".It Cm ") + each->name + '\n' +
                sentences(TextLayout::capitalised(each->summary) + ".");
    }
    text += ".El\n.Pp\n" + paragraphs(HelpText::generalDetails()) + exitStatus();
    return text + ".Sh SEE ALSO\n" + seeAlso(verbs);
}

std::string ManualPage::verb(const VerbSpec& verb) {
    std::string text = head(std::string("orvane-") + verb.name, verb.summary);
    text += synopsis(verb) + ".Sh DESCRIPTION\n" + paragraphs(verb.details) + options(verb);
    return text + exitStatus() + examples(verb) + ".Sh SEE ALSO\n.Xr orvane 1\n";
}

}  // namespace Commands
