#include "FeedParser/Text/SafeMarkup.h"

#include "FeedParser/Text/SafeMarkupWriter.h"

#include <libxml/HTMLparser.h>
#include <libxml/parser.h>
#include <libxml/tree.h>

#include <memory>

namespace Orvane::FeedParser {

namespace {

struct FreeDocument {
    void operator()(xmlDoc* document) const { xmlFreeDoc(document); }
};
using Document = std::unique_ptr<xmlDoc, FreeDocument>;

/// Texts that libxml2 can count.
constexpr std::size_t kLargest = 1U << 30;

/// One root around all of it. There is no document type, so there are no entities to expand, and
/// nothing to load; without a limit on the depth, for that is bounded before.
Document parseXML(const std::string& markup) {
    const std::string whole = "<orvane>" + markup + "</orvane>";
    return Document(xmlReadMemory(whole.data(), static_cast<int>(whole.size()), nullptr, "UTF-8",
                                  XML_PARSE_NOERROR | XML_PARSE_NOWARNING | XML_PARSE_NONET |
                                      XML_PARSE_NOCDATA | XML_PARSE_HUGE | XML_PARSE_COMPACT));
}

Document parseHTML(const std::string& markup) {
    return Document(htmlReadMemory(markup.data(), static_cast<int>(markup.size()), nullptr, "UTF-8",
                                   HTML_PARSE_RECOVER | HTML_PARSE_NOERROR | HTML_PARSE_NOWARNING |
                                       HTML_PARSE_NONET | HTML_PARSE_NODEFDTD |
                                       HTML_PARSE_COMPACT));
}

}  // namespace

std::string SafeMarkup::make(const std::string& markup, Foundation::URL* base) {
    if (markup.empty() || markup.size() > kLargest) return {};
    Document document = parseXML(markup);
    if (!document) document = parseHTML(markup);
    // Whoever parses next is to find only errors of its own.
    xmlResetLastError();
    if (!document) return {};
    SafeMarkupWriter writer(base);
    return writer.write(document.get());
}

}  // namespace Orvane::FeedParser
