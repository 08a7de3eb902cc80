#include "Suggestion.h"

#include <algorithm>

namespace Commands {

std::size_t Suggestion::distance(std::string_view a, std::string_view b) {
    std::vector<std::size_t> before;
    std::vector<std::size_t> last(b.size() + 1);
    for (std::size_t j = 0; j <= b.size(); ++j) {
        last[j] = j;
    }
    for (std::size_t i = 1; i <= a.size(); ++i) {
        std::vector<std::size_t> row(b.size() + 1);
        row[0] = i;
        for (std::size_t j = 1; j <= b.size(); ++j) {
            const std::size_t change = a[i - 1] == b[j - 1] ? 0 : 1;
            row[j] = std::min({last[j] + 1, row[j - 1] + 1, last[j - 1] + change});
            const bool isSwapped = i > 1 && j > 1 && a[i - 1] == b[j - 2] && a[i - 2] == b[j - 1];
            if (isSwapped) row[j] = std::min(row[j], before[j - 2] + 1);
        }
        before = std::move(last);
        last = std::move(row);
    }
    return last[b.size()];
}

std::string Suggestion::closest(std::string_view word, const std::vector<std::string>& candidates) {
    std::string best;
    // A third of a word may be wrong, and one letter of a short one.
    std::size_t least = std::max<std::size_t>(1, word.size() / 3) + 1;
    for (const std::string& candidate : candidates) {
        const bool isBegun = word.size() > 1 && candidate.starts_with(word);
        const std::size_t far = isBegun ? 1 : distance(word, candidate);
        if (far >= least) continue;
        least = far;
        best = candidate;
    }
    return best;
}

}  // namespace Commands
