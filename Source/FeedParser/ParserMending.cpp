#include "FeedParser/PageHead.h"
#include "FeedParser/Parser.h"
#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/MarkupEncoding.h"
#include "FeedParser/Text/MarkupLook.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <libxml/encoding.h>
#include <iterator>
#include <utility>

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::DataReturner;
using Foundation::Ref;

namespace {

/// The page in UTF-8. What it says of its encoding counts before what its bytes look like.
std::string decodePage(const Data& page, int encoding) {
    MarkupEncoding::Text text = MarkupEncoding::toUTF8(page.view(), 0);
    if (text.isUTF8) return std::move(text.bytes);
    text = MarkupEncoding::toUTF8(page.view(), encoding);
    if (text.isUTF8) return std::move(text.bytes);
    return MarkupEncoding::toUTF8(page.view(), XML_CHAR_ENCODING_8859_1).bytes;
}

/// The document from its declaration on, if only text and markup that is no document stands in
/// front of that, as errors of a server do. They would make it look like a page.
DataReturner withoutJunk(Data* document) {
    constexpr std::size_t kLongestJunk = 4096;
    const std::string_view bytes = document->view();
    const std::string start = XMLCharacters::toLower(bytes.substr(0, kLongestJunk));
    const std::size_t declaration = start.find("<?xml ");
    if (declaration == 0 || declaration == std::string::npos)
        return DataReturner::retained(document);
    const std::string_view junk = std::string_view(start).substr(0, declaration);
    for (const char* root : {"<html", "<rss", "<feed", "<rdf", "<!doctype", "<channel", "<entry"}) {
        if (junk.find(root) != std::string_view::npos) return DataReturner::retained(document);
    }
    return Data::data(bytes.data() + declaration, bytes.size() - declaration);
}

/// Of a page only the head is repaired.
DataReturner tidyPage(Tidier& tidier, std::string_view page) {
    const PageHead head(page);
    const Ref<Data> bytes = Data::adopt(head.getPage());
    const Ref<Data> tidied = tidier.tidy(bytes.get(), XML_CHAR_ENCODING_UTF8, nullptr);
    // What is not repaired is as good, but for what nobody asked for.
    return Data::adopt(head.restore(std::string(tidied.get() ? tidied->view() : bytes->view())));
}

}  // namespace

bool Parser::tidyDocument() {
    static const Ref<Tidier> sTidiers[] = {Ref<Tidier>(new FeedTidier),
                                           Ref<Tidier>(new HTMLDocumentTidier)};
    if (!mData.get()) return false;
    mData = withoutJunk(mData.get());
    for (std::size_t i = mTidyAsHTML ? 1 : 0; i < std::size(sTidiers); ++i) {
        Ref<Data> tidied =
            i == 0 ? sTidiers[i]->tidy(mData.get(), mEncoding, nullptr) : tidyAsHTML(*sTidiers[i]);
        if (!tidied.get()) continue;
        mData = std::move(tidied);
        mTidierName = sTidiers[i]->getClassName();
        return true;
    }
    return false;
}

DataReturner Parser::tidyAsHTML(Tidier& tidier) {
    const std::string page = decodePage(*mData.get(), mEncoding);
    if (MarkupLook::isPage(page)) return tidyPage(tidier, page);
    return tidier.tidy(mData.get(), mEncoding, nullptr);
}

}  // namespace Orvane::FeedParser
