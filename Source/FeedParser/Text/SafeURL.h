#pragma once

#include "Foundation/URL.h"

#include <optional>
#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// Makes the URLs of a stranger's markup such as may be shown: absolute, and of a scheme that only
/// leads somewhere. Whatever a browser would pass over in front of or inside a scheme is passed
/// over here too.
class SafeURL {
 public:
    enum class Use {
        Link,   ///< what a click leads to
        Image,  ///< what is shown in place; a picture may stand in the URL itself
    };

    /// What relative URLs count from. May be null: they then stay relative. Must outlive this.
    explicit SafeURL(Foundation::URL* base) : mBase(base) {}

    /// The URL to write; none if there is none that is safe. Twice gives the same as once.
    std::optional<std::string> make(std::string_view url, Use use) const;
    /// The same for a list of pictures with their sizes ("srcset"); what is not safe is left out.
    std::optional<std::string> makeSourceSet(std::string_view list) const;

 private:
    std::string makeAbsolute(const std::string& url) const;

    Foundation::URL* mBase;
};

}  // namespace Orvane::FeedParser
