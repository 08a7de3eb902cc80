// What is in the files after the process that merges was killed at any moment.

#include "FeedParser/RollingDocument.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/StorageTest.h"
#include "Support/PipedChild.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <random>
#include <set>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;

namespace {

class MergeKill : public StorageTest {
 protected:
    MergeKill() {
        std::printf("seed %u\n", seed);
        random.seed(seed);
    }

    int between(int least, int most) {
        return std::uniform_int_distribution<int>(least, most)(random);
    }
    /// Lets the worker run, and kills it at some moment of some merge. Gives the number of the last
    /// document that it has acknowledged.
    int killAtRandom() {
        Support::PipedChild child({MERGE_WORKER, base.path().string()});
        int last = 0;
        for (int merges = between(1, 6); merges > 0; --merges) {
            last = numberIn(child.readLine());
        }
        const auto end =
            std::chrono::steady_clock::now() + std::chrono::microseconds(between(0, 20000));
        while (std::chrono::steady_clock::now() < end) {
        }
        child.kill();
        for (std::string line; !(line = child.readLine()).empty();) {
            last = numberIn(line);
        }
        EXPECT_EQ(child.wait(), -1) << "it ended by itself";
        return last;
    }
    static int numberIn(const std::string& line) {
        return std::atoi(line.substr(line.find(' ') + 1).c_str());
    }

    /// That the file is what it was behind the merge of a document, with a file for each entry that
    /// has left it.
    void checkMerge(const FeedCore& feed, int number) const {
        std::set<std::string> expected, current;
        for (const Post& post : RollingDocument::posts(number)) {
            expected.insert(post.guid + " " + post.title);
        }
        for (auto entry = feed.getEntries(nullptr); entry.hasRow(); entry.nextRow()) {
            const AutoreleasePool inner;
            if (entry->mCurrent) {
                current.insert(entry->mID.getValue()->utf8() + " " +
                               entry->mTitle.getValue()->utf8());
            } else {
                checkFile(*entry.getRow());
            }
        }
        EXPECT_EQ(current, expected);
        EXPECT_EQ(db().execScalar("select unreadCount from Subscriptions"), count("Entries"));
        EXPECT_EQ(count("Contents where rowID not in (select content from Entries) and rowID not "
                        "in (select xmlRepresentation from Entries)"),
                  0);
        EXPECT_EQ(count("Enclosures where entry not in (select rowID from Entries)"), 0);
    }
    static void checkFile(EntryCore& entry) {
        const Ref<URL> url = entry.getFeed()->getURLOfEntryXMLFile(entry.getIdentifier());
        const Ref<Data> saved = Data::dataFromResource(url);
        ASSERT_NE(saved.get(), nullptr) << entry.mTitle.getValue()->utf8();
        EXPECT_TRUE(IsEqual(saved.get(), entry.getXMLRepresentation()->mData.getValue()));
    }
    /// That no file of the truth is a half one.
    void checkNoLeftovers() const {
        for (const auto& item : fs::recursive_directory_iterator(storage() / "Feeds")) {
            if (!item.is_regular_file() || item.path().extension() != ".xml") continue;
            std::ifstream file(item.path());
            const std::string content{std::istreambuf_iterator<char>(file), {}};
            EXPECT_TRUE(content.starts_with("<item>") && content.ends_with("</item>")) << item;
        }
    }

    const unsigned seed = std::random_device()();
    std::mt19937 random;
};

}  // namespace

TEST_F(MergeKill, LosesNoAcknowledgedMergeAndLeavesNoHalfOne) {
    const int kills = std::getenv("ORVANE_SLOW_TESTS") ? 200 : 20;
    int before = 0;
    for (int i = 0; i < kills; ++i) {
        const int last = killAtRandom();
        ASSERT_GT(last, before);
        const AutoreleasePool inner;
        ministry().openDatabase();
        db().integrityCheck();
        const Ref<FeedCore> feed = RollingDocument::storedFeed();
        const int number = RollingDocument::numberOf(*feed);
        // One merge may have been saved and not been acknowledged any more.
        ASSERT_TRUE(number == last || number == last + 1) << number << " of " << last;
        checkMerge(*feed, number);
        checkNoLeftovers();
        db().close(true);
        before = last;
        if (HasFailure()) return;
    }
}
