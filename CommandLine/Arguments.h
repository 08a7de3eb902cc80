#pragma once

#include "VerbSpec.h"

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace Commands {

/// What a verb was told: its options and operands, as its table allows them.
class Arguments {
 public:
    /// Reads the words behind a verb: "--name VALUE", "--name=VALUE", "-n VALUE", "-nVALUE",
    /// letters of switches in one word, and "--" in front of operands that begin with a dash.
    /// Throws `Failure` with `ExitStatus::Usage` for what the table does not allow.
    Arguments(const VerbSpec& spec, const std::vector<std::string>& words);

    /// Whether an option was given.
    bool has(const std::string& option) const { return mOptions.contains(option); }
    /// The last value that an option was given.
    std::optional<std::string> value(const std::string& option) const;
    /// All of them, in their order.
    std::vector<std::string> values(const std::string& option) const;
    /// The value as a whole number from 0 on. Throws `Failure` for any other.
    std::optional<std::size_t> number(const std::string& option) const;
    const std::vector<std::string>& operands() const { return mOperands; }
    /// Whether the short or the long help was asked for.
    bool wantsShortHelp() const { return mWantsShortHelp; }
    bool wantsManual() const { return mWantsManual; }

 private:
    using Words = std::vector<std::string>;

    void takeLong(const std::string& word, const Words& words, std::size_t& at);
    void takeShort(const std::string& word, const Words& words, std::size_t& at);
    void takeValue(const OptionSpec& option, const Words& words, std::size_t& at);
    void keep(const OptionSpec& option, const std::string& value);
    void checkOperands() const;

    const VerbSpec& mSpec;
    std::map<std::string, std::vector<std::string>> mOptions;
    std::vector<std::string> mOperands;
    bool mWantsShortHelp = false;
    bool mWantsManual = false;
};

}  // namespace Commands
