#include "FeedParser/Parser.h"
#include "FeedParser/Text/TidyHelper.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Model/ContentCore.h"
#include "SQLite/Database.h"

#include <sys/resource.h>

#include <cstdio>
#include <fstream>
#include <sstream>
#include <string>

/// hostile_reader FILE: reads a document whole, tidied contents too, and says what it is and how
/// many entries it has. A process of its own, so that what that costs is its own; one that would
/// hang or bloat is ended.

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;

namespace {

constexpr rlim_t kProcessorSeconds = 10;
#ifndef __SANITIZE_ADDRESS__
constexpr rlim_t kAddressSpace = rlim_t{4} << 30;
#endif

void limitMyself() {
    const rlimit processor{kProcessorSeconds, kProcessorSeconds};
    setrlimit(RLIMIT_CPU, &processor);
#ifndef __SANITIZE_ADDRESS__
    const rlimit memory{kAddressSpace, kAddressSpace};
    setrlimit(RLIMIT_AS, &memory);
#endif
}

std::string contentOf(const char* path) {
    std::ifstream file(path, std::ios::binary);
    std::stringstream content;
    content << file.rdbuf();
    return content.str();
}

/// Asks for all that waits to be made.
void look(EntryCore& entry) {
    const AutoreleasePool pool;
    for (const ContentCore* content : {entry.getContent(), entry.getSummary()}) {
        if (content) content->getData();
    }
    entry.getXMLRepresentationHash();
}

int lookAtEntries(const Info& info) {
    if (EntryCore* single = info.getEntry()) {
        look(*single);
        return 1;
    }
    int count = 0;
    if (const FeedCore* feed = info.getFeed()) {
        for (auto each = feed->getEntries(nullptr); each.hasRow(); each.nextRow()) {
            look(*each.getRow());
            ++count;
        }
    }
    return count;
}

void lookAtLinks(const ArrayOf<HTMLLink>* links) {
    if (!links) return;
    for (const HTMLLink* link : *links) {
        const AutoreleasePool pool;
        const Ref<URL> url = link->getURL();
        link->getHTMLLinkType();
    }
}

}  // namespace

int main(int, char** arguments) {
    limitMyself();
    SQLite::Database::initialize();
    const AutoreleasePool pool;
    const std::string document = contentOf(arguments[1]);
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Ref<String> address = String::string("http://example.org/");
    const Ref<URL> url = URL::url(address.get());
    const FeedParser::Parser parser(data.get(), url.get());
    const Info& info = *parser.getInfo();
    lookAtLinks(info.links.get());
    if (const HTMLPage* page = info.getPage()) lookAtLinks(page->getLinks());
    const int entries = lookAtEntries(info);
    // So that what it cost is counted.
    FeedParser::TidyHelper::getShared().stop();
    const FeedCore* feed = info.getFeed();
    const String* title = feed ? feed->mTitle.getValue() : nullptr;
    std::printf("%d %d %s\n", static_cast<int>(info.kind), entries,
                title ? title->utf8().substr(0, 100).c_str() : "");
    return 0;
}
