#include "FeedParser/Parser.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/UTF8.h"
#include "Fuzz/FuzzTarget.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "SQLite/Database.h"
#include "Support/ManualClock.h"

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;
using FeedParser::Parser;

namespace {

/// Whatever came in, texts of rows are UTF-8: they go into the database and to other programs.
void check(const String* text) {
    if (text) require(UTF8::isValid(text->view()));
}

void check(const ContentCore* content) {
    if (!content) return;
    check(content->mMIMEType.getValue());
    // Of a broken binary content nothing is left, not even the data.
    const Data* data = content->mData.getValue();
    require(!data || content->mMIMEType.getValue());
}

void check(EntryCore& entry) {
    check(entry.mID.getValue());
    check(entry.mTitle.getValue());
    check(entry.mRights.getValue());
    check(entry.getXMLRepresentationHash());
    check(entry.getContent());
    check(entry.getSummary());
    for (auto each = entry.getEnclosures(nullptr); each.hasRow(); each.nextRow()) {
        check(each->mTitle.getValue());
        check(each->mMIMEType.getValue());
        require(each->mURL.getValue());
    }
}

void check(const FeedCore& feed) {
    check(feed.mTitle.getValue());
    check(feed.mSubtitle.getValue());
    check(feed.mID.getValue());
    for (auto each = feed.getEntries(nullptr); each.hasRow(); each.nextRow()) {
        const AutoreleasePool pool;
        require(each->mCurrent.getValue());
        check(*each.getRow());
    }
}

void check(const ArrayOf<HTMLLink>* links) {
    if (!links) return;
    for (const HTMLLink* link : *links) {
        const Ref<URL> url = link->getURL();
        const std::int32_t kind = link->getHTMLLinkType();
        require(kind >= HTMLLink::kNothing && kind <= HTMLLink::kAlternatePage);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    static Support::ManualClock sClock;  // so that an input always does the same
    static NoLog sNoLog;
    SQLite::Database::initialize();
    const AutoreleasePool pool;
    const Ref<Data> data = Data::data(bytes, size);
    const Ref<String> address = String::string("http://example.org/feed/index.xml");
    const Ref<URL> url = URL::url(address);
    const Parser parser(data, url);
    const Info& info = *parser.getInfo();
    require(parser.getAttemptCount() >= 1 && parser.getAttemptCount() <= 4);
    if (const FeedCore* feed = info.getFeed()) check(*feed);
    if (EntryCore* entry = info.getEntry()) check(*entry);
    if (const HTMLPage* page = info.getPage()) check(page->getLinks());
    if (Friend* person = info.getFriend()) check(person->getName());
    check(info.links.get());
    return 0;
}
