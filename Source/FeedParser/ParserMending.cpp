#include "FeedParser/Parser.h"
#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"

namespace Orvane::FeedParser {

using Foundation::Data;
using Foundation::Ref;

bool Parser::tidyDocument() {
    static const Ref<Tidier> sTidiers[] = {Ref<Tidier>(new FeedTidier),
                                           Ref<Tidier>(new HTMLDocumentTidier)};
    for (std::size_t i = mTidyAsHTML ? 1 : 0; i < std::size(sTidiers); ++i) {
        Tidier& tidier = *sTidiers[i];
        Ref<Data> tidied = tidier.tidy(mData.get(), mEncoding, nullptr);
        if (!tidied.get()) continue;
        mData = std::move(tidied);
        mTidierName = tidier.getClassName();
        return true;
    }
    return false;
}

}  // namespace Orvane::FeedParser
