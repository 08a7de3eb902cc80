#pragma once

#include <Orvane/OVDocument.h>
#include <Orvane/OVError.h>
#include <Orvane/OVFeed.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace Commands {

/// Finds out what feeds a URL leads to, by fetching it.
class Discovery {
 public:
    struct Candidate {
        std::string url;
        std::string title;
    };
    struct Result {
        std::vector<Candidate> feeds;  ///< none if nothing was found
        std::optional<OVError> error;  ///< that fetching ended with
    };

    /// Seconds that a server is given to answer.
    static constexpr double kPatience = 90;

    /// The sources that a word of the command line stands for: the URL itself, that of a "feed:"
    /// form, those of a "feeds:" form, a file's, or with "https://" in front of what has no scheme.
    static std::vector<std::string> sourcesOf(const std::string& word);

    /// What fetching a source gave.
    struct Fetched {
        std::shared_ptr<OVFeed> feed;  ///< in memory; its `XMLData` is what came
        std::optional<OVError> error;
        bool isDocument = false;  ///< whether something came, a feed or not
    };
    static Fetched fetch(const std::string& url);

    /// Fetches a source. It may be a feed itself, or a page that links to feeds.
    static Result find(const std::string& url);

    /// The feeds that a document from this URL links to, each once.
    static std::vector<Candidate> linksOf(const OVDocument& document);
};

}  // namespace Commands
