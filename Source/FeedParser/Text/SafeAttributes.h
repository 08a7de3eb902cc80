#pragma once

#include "FeedParser/Text/SafeURL.h"

#include <functional>
#include <optional>
#include <set>
#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// Which attributes of a stranger's markup may be shown, and in what form.
class SafeAttributes {
 public:
    /// Whose attribute it is.
    enum class Vocabulary { HTML, SVG, MathML };
    using Value = std::optional<std::string>;

    /// `base` may be null; else it must outlive this.
    explicit SafeAttributes(Foundation::URL* base) : mURLs(base) {}

    /// The value to write for an attribute; none if it is not to be written. `element` and `name`
    /// are in lower case, without a prefix except for "xml:lang" and "xlink:href".
    Value make(Vocabulary vocabulary, std::string_view element, std::string_view name,
               std::string_view value);
    /// The name as it is spelled, which in SVG is not in lower case alone.
    static std::string_view getSpelling(Vocabulary vocabulary, std::string_view name);

    const SafeURL& getURLs() const { return mURLs; }

    /// Whether a link led to a name in the content before it was known which names that has. What
    /// was written so far is then to be written again, after `learnNames`.
    bool needsNames() const { return mNeedsNames && !mMadeNames.empty(); }
    /// The names that were given so far are all that links can lead to.
    void learnNames();

 private:
    Value makeHTML(std::string_view element, std::string_view name, std::string_view value);
    Value makeSVG(std::string_view element, std::string_view name, std::string_view value);
    Value makeName(std::string_view name);
    Value makeLink(std::string_view url);
    /// "#name", if the content has such a name.
    Value makeFragment(std::string_view url);
    /// A colour, or "url(#name)".
    Value makePaint(std::string_view value);

    SafeURL mURLs;
    std::set<std::string, std::less<>> mNames;      ///< that links can lead to
    std::set<std::string, std::less<>> mMadeNames;  ///< given to elements so far
    bool mNeedsNames = false;
};

}  // namespace Orvane::FeedParser
