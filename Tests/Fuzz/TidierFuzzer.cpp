#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/SafeMarkup.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Fuzz/FuzzTarget.h"

#include <libxml/parser.h>

#include <iterator>
#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

bool isWellFormed(const std::string& xml) {
    xmlDoc* document = xmlReadMemory(xml.data(), static_cast<int>(xml.size()), nullptr, nullptr,
                                     XML_PARSE_NOERROR | XML_PARSE_NOWARNING | XML_PARSE_HUGE);
    const bool isWhole = document != nullptr;
    xmlFreeDoc(document);
    xmlResetLastError();
    return isWhole;
}

/// Where a tidier would do it in this process.
template <class T>
TidyResult tidy(std::string_view markup, int encoding, URL* base) {
    static const Ref<T> sTidier = Returner<T>::adopted(new T);
    if (!sTidier->mayTidyHere(markup)) return {};
    return sTidier->tidyHere(markup, encoding, base);
}

/// Safe markup is well-formed, and the pass gives the same twice.
void checkSafe(const TidyResult& result, URL* base) {
    if (!result.isSuccess()) return;
    require(isWellFormed("<a>" + result.output + "</a>"));
    for (const char* bad : {"<script", "<style", "<base", "<meta", "<object", "<embed", "<form"})
        require(result.output.find(bad) == std::string::npos);
    const std::string again = SafeMarkup::make(result.output, base);
    require(again == SafeMarkup::make(again, base));
}

}  // namespace

/// The first byte chooses the encoding, the rest is markup for each of the tidiers.
extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    constexpr int kEncodings[] = {0, 1, 2, 10, 20};
    if (size == 0) return 0;
    const AutoreleasePool pool;
    const int encoding = kEncodings[bytes[0] % std::size(kEncodings)];
    const std::string_view markup(reinterpret_cast<const char*>(bytes) + 1, size - 1);
    const Ref<URL> base = URL::url(String::string("http://h/d/f"));

    checkSafe(tidy<HTMLSnippetTidier>(markup, encoding, base.get()), base.get());
    checkSafe(tidy<XMLSnippetTidier>(markup, encoding, base.get()), base.get());
    tidy<HTMLDocumentTidier>(markup, encoding, nullptr);
    const TidyResult feed = tidy<FeedTidier>(markup, encoding, nullptr);
    const bool hasRoot =
        feed.output.find("</") != std::string::npos || feed.output.find("/>") != std::string::npos;
    if (feed.isSuccess() && hasRoot && encoding == 1) require(isWellFormed(feed.output));
    return 0;
}
