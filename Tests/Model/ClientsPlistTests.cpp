#include "Model/ClientsPlist.h"

#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"
#include "Model/StorageTest.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Exception.h"
#include "SQLite/TableOf.h"
#include "Support/FileAccess.h"

#include <gmock/gmock.h>

#include <algorithm>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using testing::ElementsAre;

namespace {

class ClientsPlistTest : public StorageTest {
 protected:
    ClientsPlistTest() { makeInMemory(); }

    static void addClient(int id, const char* signature, int isPrivate, double used) {
        db().execute("insert into Clients values (%d, %Q, %d, %f)", id, signature, isPrivate, used);
    }
    static void addFeed(int id, const char* url, const char* login = nullptr) {
        db().execute("insert into Feeds (rowID, url, login) values (%d, %Q, %Q)", id, url, login);
    }
    /// With nothing but what must be there.
    static void addSubscription(int id, int client, int feed) {
        db().execute("insert into Subscriptions (rowID, client, feed) values (%d, %d, %d)", id,
                     client, feed);
    }
    static std::string describe() {
        const Ref<Dictionary> root = ClientsPlist::describeDatabase();
        const Ref<String> text = root->toString();
        return text->utf8();
    }
    bool write(const char* value) const {
        const Ref<String> text = String::string(value);
        const Ref<MutableDictionary> root{MutableDictionary::dictionary()};
        root->set("Key", text.get());
        return ClientsPlist::write(root, plist());
    }
    URL* plist() const { return urlOf("Clients.plist"); }
    std::string valueRead() const {
        const Ref<Dictionary> root = ClientsPlist::read(plist());
        auto* text = root ? root->getAs<String>("Key") : nullptr;
        return text ? text->utf8() : "nothing";
    }
    std::vector<std::string> names() const {
        std::vector<std::string> result;
        for (const auto& entry : fs::directory_iterator(storage())) {
            result.push_back(entry.path().filename());
        }
        std::sort(result.begin(), result.end());
        return result;
    }
};

constexpr const char* kEmpty = "{Clients = {}, Feeds = {}, Subscriptions = {}}";

}  // namespace

TEST_F(ClientsPlistTest, HasEverySettingOfASubscription) {
    addClient(3, "com.example.reader", 1, 700000000);
    addFeed(5, "http://example.com/feed", "anna");
    db().execute(
        "insert into Subscriptions values (7, 3, 5, 300.5, 86400, 650000000, 1, 1, 1e6, "
        "'audio/mpeg;video/mp4', 12)");
    ministry().saveSubscriptions();
    std::string text = readFile("Clients.plist");
    std::erase_if(text, [](char c) { return c == '\t' || c == '\n'; });
    EXPECT_THAT(text,
                testing::EndsWith("<dict><key>Clients</key><dict><key>3</key><dict>"
                                  "<key>Signature</key><string>com.example.reader</string>"
                                  "<key>Private</key><true/>"
                                  "<key>DateUsed</key><date>2023-03-08T20:26:40Z</date>"
                                  "</dict></dict>"
                                  "<key>Feeds</key><dict><key>5</key><dict>"
                                  "<key>URL</key><string>http://example.com/feed</string>"
                                  "<key>Login</key><string>anna</string>"
                                  "</dict></dict>"
                                  "<key>Subscriptions</key><dict><key>7</key><dict>"
                                  "<key>Client</key><integer>3</integer>"
                                  "<key>Feed</key><integer>5</integer>"
                                  "<key>RefreshInterval</key><real>300.5</real>"
                                  "<key>ExpirationInterval</key><real>86400</real>"
                                  "<key>RefreshesInBackground</key><true/>"
                                  "<key>DownloadsEnclosures</key><true/>"
                                  "<key>MaxEnclosureSize</key><real>1000000</real>"
                                  "<key>EnclosureTypes</key><string>audio/mpeg;video/mp4</string>"
                                  "</dict></dict></dict></plist>"));
}

TEST_F(ClientsPlistTest, LeavesOutWhatIsNoneFalseOrZero) {
    addClient(1, "a", 0, 0);
    addFeed(2, "http://b/");
    db().execute("insert into Subscriptions values (4, 1, 2, 0, 0, 0, 0, 0, 0, null, 0)");
    addSubscription(5, 1, 0);
    EXPECT_EQ(describe(),
              "{Clients = {1 = {Signature = a}}, Feeds = {2 = {URL = http://b/}}, "
              "Subscriptions = {4 = {Client = 1, Feed = 2}, 5 = {Client = 1}}}");
}

TEST_F(ClientsPlistTest, HasOnlyWhatSomeSubscriptionReaches) {
    addClient(1, "a", 0, 0);
    addClient(2, "without a subscription", 0, 0);
    addFeed(1, "http://a/");
    addFeed(2, "http://nobody/");
    EXPECT_EQ(describe(), kEmpty);
    addSubscription(9, 1, 1);
    addSubscription(10, 1, 1);
    EXPECT_EQ(describe(),
              "{Clients = {1 = {Signature = a}}, Feeds = {1 = {URL = http://a/}}, "
              "Subscriptions = {9 = {Client = 1, Feed = 1}, 10 = {Client = 1, Feed = 1}}}");
}

TEST_F(ClientsPlistTest, LeavesOutASubscriptionOfNothing) {
    addClient(1, "a", 0, 0);
    addSubscription(4, 1, 88);
    addSubscription(5, 77, 0);
    addSubscription(6, 0, 0);
    const unsigned hits = getExceptionHits();
    EXPECT_EQ(describe().find("4 ="), std::string::npos);
    EXPECT_EQ(getExceptionHits(), hits + 3);
    addSubscription(8, 1, 0);
    EXPECT_THAT(describe(), testing::HasSubstr("Subscriptions = {8 = {Client = 1}}"));
}

TEST_F(ClientsPlistTest, LeavesOutATextThatXMLCannotHoldAndSavesTheOthers) {
    addClient(1, "a", 0, 0);
    addFeed(2, "http://b/", "bell \a");
    addSubscription(3, 1, 2);
    ministry().saveSubscriptions();
    EXPECT_EQ(log.count("Cannot save \"Login\" of a row: "), 1);
    const Ref<Dictionary> root = ClientsPlist::read(plist());
    ASSERT_TRUE(root);
    const Ref<String> text = root->toString();
    EXPECT_THAT(text->utf8(), testing::HasSubstr("Feeds = {2 = {URL = http://b/}}"));
}

TEST_F(ClientsPlistTest, HasTheChangesThatAreNotSavedYet) {
    addClient(1, "a", 0, 0);
    addSubscription(3, 1, 0);
    const Ref<SubscriptionCore> row = SQLite::TableOf<SubscriptionCore>::instance()->rowWithID(3);
    row->mRefreshInterval.setValue(60);
    EXPECT_THAT(describe(), testing::HasSubstr("RefreshInterval = 60"));
}

TEST_F(ClientsPlistTest, IsNotTouchedIfTheDatabaseFails) {
    ASSERT_TRUE(write("old"));
    db().execute("drop table Subscriptions");
    EXPECT_THROW(ministry().saveSubscriptions(), SQLite::Exception);
    EXPECT_EQ(valueRead(), "old");
}

TEST_F(ClientsPlistTest, ReplacesTheOneBefore) {
    EXPECT_TRUE(write("old"));
    EXPECT_TRUE(write("new"));
    EXPECT_EQ(valueRead(), "new");
    EXPECT_THAT(names(), ElementsAre("Clients.plist"));
}

TEST_F(ClientsPlistTest, SaysWhatCannotBeRead) {
    EXPECT_EQ(valueRead(), "nothing");
    writeFile("Clients.plist", "<plist><dict>");
    EXPECT_EQ(valueRead(), "nothing");
    writeFile("Clients.plist", "<plist><string>text</string></plist>");
    EXPECT_EQ(valueRead(), "nothing");
    EXPECT_EQ(log.count("Could not read file://"), 3);
}

TEST_F(ClientsPlistTest, KeepsOneThatCannotBeReadBesideTheNewOne) {
    for (const char* unreadable : {"<plist><dict>", "", "<plist><array/></plist>"}) {
        writeFile("Clients.plist", unreadable);
        EXPECT_TRUE(write(unreadable));
        EXPECT_EQ(valueRead(), unreadable);
    }
    EXPECT_THAT(names(), ElementsAre("Clients-unreadable-1.plist", "Clients-unreadable-2.plist",
                                     "Clients-unreadable.plist", "Clients.plist"));
    EXPECT_EQ(readFile("Clients-unreadable.plist"), "<plist><dict>");
    EXPECT_EQ(readFile("Clients-unreadable-1.plist"), "");
    EXPECT_EQ(readFile("Clients-unreadable-2.plist"), "<plist><array/></plist>");
}

TEST_F(ClientsPlistTest, StaysAsItWasOnAFullDisk) {
    ASSERT_TRUE(write("old"));
    {
        const Support::FileSizeLimit full(16);
        EXPECT_FALSE(write("new"));
    }
    EXPECT_EQ(log.count("Could not write file://"), 1);
    EXPECT_EQ(valueRead(), "old");
    EXPECT_THAT(names(), ElementsAre("Clients.plist"));
}

TEST_F(ClientsPlistTest, IsNotReplacedIfItCanNeitherBeReadNorKept) {
    writeFile("Clients.plist", "unreadable");
    fs::permissions(storage() / "Clients.plist", fs::perms::all);
    fs::permissions(base.path(), fs::perms::all);
    fs::permissions(storage(), static_cast<fs::perms>(0555));
    {
        const Support::OrdinaryFileAccess ordinary;
        EXPECT_FALSE(write("new"));
    }
    fs::permissions(storage(), fs::perms::owner_all);
    EXPECT_EQ(log.count("Could not keep file://"), 1);
    EXPECT_EQ(readFile("Clients.plist"), "unreadable");
    EXPECT_THAT(names(), ElementsAre("Clients.plist"));
}
