#include "FeedParser/Text/HTMLLink.h"
#include "Foundation/AutoreleasePool.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdlib>
#include <fstream>
#include <string>

using namespace Foundation;
using nlohmann::json;
using Orvane::HTMLLink;

namespace {

Ref<String> textOf(const json& link, const char* key) {
    const auto value = link.find(key);
    if (value == link.end() || value->is_null()) return nullptr;
    return String::string(value->get<std::string>());
}

}  // namespace

TEST(LinkCorpus, HasTheKindsOfItsPages) {
    const char* directory = std::getenv("ORVANE_CORPUS");
    if (!directory) GTEST_SKIP() << "ORVANE_CORPUS is not set";
    std::ifstream file(std::string(directory) + "/pages/expected.json");
    const json pages = json::parse(file);
    int count = 0;
    for (const auto& [name, page] : pages.items()) {
        for (const json& entry : page["links"]) {
            const AutoreleasePool pool;
            const Ref<HTMLLink> link = new HTMLLink();
            link->mRel = textOf(entry, "rel");
            link->mType = textOf(entry, "type");
            link->mTitle = textOf(entry, "title");
            link->mHref = textOf(entry, "href");
            EXPECT_EQ(link->getHTMLLinkType(), entry["kind"].get<int>()) << name << entry;
            ++count;
        }
    }
    EXPECT_GT(count, 0);
}
