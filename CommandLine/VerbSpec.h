#pragma once

#include <cstddef>
#include <limits>
#include <string>
#include <vector>

namespace Commands {

/// What a word of the command line stands for, so that shells can complete it.
enum class WordKind { Free, File, Feed, Entry, Choice };

/// An option of a verb.
struct OptionSpec {
    const char* name;           ///< without the dashes
    char letter = 0;            ///< of its short form; 0 for none
    const char* argument = "";  ///< what the help calls its value; empty for a switch
    const char* help = "";
    WordKind kind = WordKind::Free;
    std::vector<std::string> choices = {};  ///< the only values, for `WordKind::Choice`
};

/// All that is known of a verb beside its work: parsing, help, manual pages and completions are
/// made from it, so that none of them can tell another story.
struct VerbSpec {
    static constexpr std::size_t kAny = std::numeric_limits<std::size_t>::max();

    const char* name;
    const char* summary;        ///< what it does, in a few words
    const char* operands = "";  ///< how the help shows what stands behind the options
    std::size_t fewest = 0;     ///< operands that it must be given
    std::size_t most = 0;
    WordKind kind = WordKind::Free;
    std::vector<std::string> choices = {};  ///< of the first operand; empty for any
    std::vector<OptionSpec> options = {};
    const char* details = "";                ///< paragraphs, with an empty line in between
    std::vector<std::string> examples = {};  ///< what to type behind "orvane"
};

}  // namespace Commands
