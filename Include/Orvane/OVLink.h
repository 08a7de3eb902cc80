#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVXMLElement.h>

#include <optional>
#include <set>
#include <string>
#include <vector>

/// A link of a feed or a page to something else. A plain value; texts are UTF-8.
class OVLink {
 public:
    using Text = std::optional<std::string>;  ///< none for what the link does not say

    /// What a link leads to.
    enum class Kind {
        Nothing = 0,  ///< nothing of interest
        RSSFeed = 1,
        AtomFeed = 2,
        AtomService = 3,
        FOAFDocument = 4,
        RSDDocument = 5,
        Self = 6,  ///< the document itself
        AlternatePage = 7,
    };

    /// The links of a document, by its root: those of an XHTML page's head, of an RDF document's
    /// channel, or right below the element. `baseURL`, which may be empty, is what relative URLs
    /// count from. None, which is not an empty list, for a page without a head and for RDF without
    /// a channel. Throws `OVException` for a base that is no URL.
    OV_EXPORT static std::optional<std::vector<OVLink>> linksInXML(
        const std::optional<OVXMLElement>& element, const std::string& baseURL = {});
    /// The link that an element is; none if it leads nowhere. Throws as above.
    OV_EXPORT static std::optional<OVLink> fromElement(const OVXMLElement& element,
                                                       const std::string& baseURL = {});
    /// A link by its attributes; none for an empty `href`. `rel` is a list of words with blanks in
    /// between. Throws as above, and for texts that are not UTF-8.
    OV_EXPORT static std::optional<OVLink> make(const Text& rel, const Text& type,
                                                const Text& title, const Text& href,
                                                const std::string& baseURL = {});

    /// By relation, type and title.
    Kind linkKind() const { return mLinkKind; }
    /// The words of `rel` in lower case; none without any `rel`.
    const std::optional<std::set<std::string>>& relations() const { return mRelations; }
    /// The media type of what it leads to.
    const Text& MIMEType() const { return mMIMEType; }
    /// A label, in plain text.
    const Text& title() const { return mTitle; }
    /// As it is written.
    const std::string& href() const { return mHref; }
    /// Where it leads, absolute if the base allows that; none if it is no URL.
    OV_EXPORT Text URL() const;

 private:
    OVLink() = default;

    Kind mLinkKind = Kind::Nothing;
    std::optional<std::set<std::string>> mRelations;
    Text mMIMEType;
    Text mTitle;
    std::string mHref;
    std::string mBaseURL;
};
