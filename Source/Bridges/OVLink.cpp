#include <Orvane/OVLink.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVXMLElementTree.h"
#include "Bridges/PublicValues.h"
#include "FeedParser/Text/HTMLLink.h"

using namespace Foundation;
using namespace Orvane;

namespace {

constexpr const char* kRDFNamespace = "http://www.w3.org/1999/02/22-rdf-syntax-ns#";
constexpr const char* kRSSNamespace = "http://purl.org/rss/1.0/";
constexpr const char* kAtomNamespace = "http://www.w3.org/2005/Atom";

/// What a document's links stand in; null if it has not got that.
Ref<XMLElement> holderOfLinks(XMLElement& root) {
    if (root.ov_hasName("html", XMLElement::kXHTMLNamespace)) return firstChild(root, "head");
    if (root.ov_hasName("RDF", kRDFNamespace)) return channelOf(root);
    return &root;
}

OVLink::Text attributeOf(const XMLElement& element, const char* name) {
    const Ref<String> value = element.getAttribute(name);
    return textOf(value.get());
}

std::optional<OVLink> linkOf(const XMLElement& element, const std::string& baseURL) {
    const Ref<String> uri = element.ov_namespace();
    OVLink::Text rel;
    OVLink::Text href;
    if (!uri.get() || uri->view() == kRSSNamespace) {
        const Ref<String> text = element.getStringValue();
        rel = "alternate";
        href = textOf(text.get());
    } else {
        rel = attributeOf(element, "rel");
        if (!rel && uri->view() == kAtomNamespace) rel = "alternate";
        href = attributeOf(element, "href");
    }
    return OVLink::make(rel, attributeOf(element, "type"), attributeOf(element, "title"), href,
                        baseURL);
}

std::set<std::string> wordsOf(const std::string& rel) {
    const Ref<String> text = stringOf(rel);
    const Ref<String> lower = text->getLowerCaseString();
    std::set<std::string> words;
    for (std::string_view rest = lower->view(); !rest.empty();) {
        const std::size_t end = std::min(rest.find(' '), rest.size());
        if (end > 0) words.emplace(rest.substr(0, end));
        rest.remove_prefix(std::min(end + 1, rest.size()));
    }
    return words;
}

Ref<HTMLLink> coreLink(const OVLink::Text& rel, const OVLink::Text& type, const OVLink::Text& title,
                       const std::string& href, const std::string& baseURL) {
    const Ref<URL> base = urlOf(OVLink::Text(baseURL));
    return Returner<HTMLLink>::adopted(new HTMLLink(stringOf(rel).get(), stringOf(type).get(),
                                                    stringOf(title).get(), stringOf(href).get(),
                                                    base.get()));
}

OVLink::Kind kindOf(const HTMLLink& link) {
    const int kind = link.getHTMLLinkType();
    return kind >= HTMLLink::kRSSFeed && kind <= HTMLLink::kAlternatePage
               ? static_cast<OVLink::Kind>(kind)
               : OVLink::Kind::Nothing;
}

}  // namespace

std::optional<std::vector<OVLink>> OVLink::linksInXML(const std::optional<OVXMLElement>& element,
                                                      const std::string& baseURL) {
    if (!element) return std::nullopt;
    return reporting("+[OVLink linksInXML:baseURL:]", [&]() -> std::optional<std::vector<OVLink>> {
        const Ref<XMLElement> holder = holderOfLinks(*element->_tree().get());
        if (!holder.get()) return std::nullopt;
        std::vector<OVLink> links;
        const Ref<XMLElement::Elements> children = holder->getElements();
        for (const XMLElement* child : *children) {
            const Ref<String> name = child->getLocalName();
            if (name->view() != "link") continue;
            if (std::optional<OVLink> link = linkOf(*child, baseURL)) links.push_back(*link);
        }
        return links;
    });
}

std::optional<OVLink> OVLink::fromElement(const OVXMLElement& element, const std::string& baseURL) {
    return raising("-[OVLink initWithElement:baseURL:]",
                   [&] { return linkOf(*element._tree().get(), baseURL); });
}

std::optional<OVLink> OVLink::make(const Text& rel, const Text& type, const Text& title,
                                   const Text& href, const std::string& baseURL) {
    if (!href || href->empty()) return std::nullopt;
    return raising("-[OVLink initWithRel:type:title:href:baseURL:]",
                   [&]() -> std::optional<OVLink> {
                       OVLink link;
                       if (rel && !rel->empty()) link.mRelations = wordsOf(*rel);
                       link.mMIMEType = type;
                       link.mTitle = title;
                       link.mHref = *href;
                       link.mBaseURL = baseURL;
                       const Ref<HTMLLink> core = coreLink(rel, type, title, *href, baseURL);
                       link.mLinkKind = kindOf(*core);
                       return link;
                   });
}

OVLink::Text OVLink::URL() const {
    return raising("-[OVLink URL]", [&]() -> Text {
        const Ref<Foundation::URL> base = urlOf(Text(mBaseURL));
        const Ref<String> text = stringOf(mHref);
        Ref<Foundation::URL> url = Foundation::URL::url(text.get(), base.get());
        if (!url.get()) url = Foundation::URL::lenientURL(text.get(), base.get());
        return textOf(url.get());
    });
}
