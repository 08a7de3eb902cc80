#include "FeedParser/Text/FeedTidier.h"

#include "FeedParser/Text/MarkupLook.h"
#include "FeedParser/Text/TidyDocument.h"

namespace Orvane::FeedParser {

namespace {

/// Tidy's own result for what it cannot repair.
constexpr int kRefused = 2;

}  // namespace

bool FeedTidier::setupTidyOptions() {
    return Tidier::setupTidyOptions() && mDoc->set("input-xml", "yes") &&
           mDoc->set("output-xml", "yes");
}

int FeedTidier::repair(const MarkupEncoding::Text& text, Foundation::URL* /*baseURL*/,
                       std::string& output) {
    // A page that is balanced as XML is no page any more: what it leaves open would hold the rest.
    if (MarkupLook::isPage(text.bytes)) return kRefused;
    return repairXML(text, XMLMending::Kind::Feed, output);
}

}  // namespace Orvane::FeedParser
