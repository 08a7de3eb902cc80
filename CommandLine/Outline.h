#pragma once

#include <string>
#include <utility>
#include <vector>

namespace Commands {

/// A feed or a folder of an outline (OPML 1.0 to 2.0, http://opml.org/spec2.opml).
struct Outline {
    using Attributes = std::vector<std::pair<std::string, std::string>>;

    std::string title;
    std::string url;                ///< of a feed; empty for a folder
    std::string page;               ///< of a feed
    Attributes others;              ///< that are not one of these, as they were found
    std::vector<Outline> children;  ///< of a folder

    bool isFeed() const { return !url.empty(); }
};

}  // namespace Commands
