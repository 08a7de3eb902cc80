#include "CommonOptions.h"

namespace Commands {

std::vector<OptionSpec> CommonOptions::join(std::vector<std::vector<OptionSpec>> lists) {
    std::vector<OptionSpec> all;
    for (std::vector<OptionSpec>& list : lists) {
        all.insert(all.end(), list.begin(), list.end());
    }
    return all;
}

std::vector<OptionSpec> CommonOptions::output() {
    return {{"json", 0, "", "One JSON document"}, {"jsonl", 0, "", "A JSON object on each line"}};
}

std::vector<OptionSpec> CommonOptions::client() {
    return {{"client", 0, "ID", "Act for the application of this identifier"}};
}

std::vector<OptionSpec> CommonOptions::dryRun() {
    return {{"dry-run", 0, "", "Say what would be done, and do nothing"}};
}

}  // namespace Commands
