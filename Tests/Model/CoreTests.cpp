#include "Model/Core.h"

#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/DeclaredColumns.h"
#include "Model/ModelTest.h"
#include "Model/PublicObjects.h"
#include "Support/AssertionOf.h"

#include <Orvane/OVObject.h>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::assertionOf;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class FakeObject : public OVObject {
 public:
    int kind = 0;
};

/// Gives the same object for every row, of a kind for each class.
class FakeObjects : public PublicObjects {
 public:
    FakeObjects() { setCurrent(this); }
    ~FakeObjects() override { setCurrent(nullptr); }

    OVObject* make(ClientCore*) override { return madeOf(1); }
    OVObject* make(SubscriptionCore*) override { return madeOf(2); }
    OVObject* make(EntryCore*) override { return madeOf(3); }
    OVObject* make(ContentCore*) override { return madeOf(4); }
    OVObject* make(AuthorCore*) override { return madeOf(5); }
    OVObject* make(EnclosureCore*) override { return madeOf(6); }
    const char* getClassName(const OVObject*) noexcept override { return "OVThing"; }

    FakeObject object;
    int made = 0;
    bool fails = false;

 private:
    OVObject* madeOf(int kind) {
        ++made;
        object.kind = kind;
        return fails ? nullptr : &object;
    }
};

class CoreTest : public ModelTest {
 protected:
    template <class T>
    static Ref<T> row() {
        return Returner<T>::adopted(new T);
    }
    /// Which of the port's operations makes the object of a class.
    template <class T>
    int kindOf() {
        const Ref<T> core = row<T>();
        OVObject* object = Core::getOVObject(core.get());
        core->clearOVObject(object);
        return static_cast<FakeObject*>(object)->kind;
    }

    FakeObjects objects;
    LogCapture log;
};

}  // namespace

TEST_F(CoreTest, GivesTheRowOfAnID) {
    db().execute("insert into Authors (rowID, name) values (7, 'A')");
    AuthorCore* author = AuthorCore::getRow(7);
    EXPECT_EQ(author->getRowID(), 7);
    EXPECT_FALSE(author->isLoaded());
    EXPECT_EQ(author->mName.getValue()->utf8(), "A");
    EXPECT_EQ(AuthorCore::getRow(7), author);
}

TEST_F(CoreTest, ThrowsForARowThatIsNotThere) {
    try {
        FeedCore::getRow(123);
        FAIL();
    } catch (const NetException& e) {
        EXPECT_EQ(e.getDomain(), 1002);
        EXPECT_EQ(e.getCode(), 200);
    }
    EXPECT_TRUE(log.contains("Core::getRow: No such rowID 123 in Feeds"));
    EXPECT_EQ(TableOf<FeedCore>::instance()->getCachedRowCount(), 0u);
}

TEST_F(CoreTest, ThrowsForARowThatIsGone) {
    db().execute("insert into Feeds (rowID, url) values (7, 'http://a/')");
    FeedCore* feed = FeedCore::getRow(7);
    EXPECT_EQ(feed->mLogin.getValue(), nullptr);
    feed->deleteRow();
    EXPECT_THROW(FeedCore::getRow(7), NetException);
}

TEST_F(CoreTest, RefusesIDsThatNoRowCanHave) {
    EXPECT_EQ(assertionOf([] { AuthorCore::getRow(0); }), "rowID>0");
    EXPECT_EQ(assertionOf([] { AuthorCore::getRow(-1); }), "rowID>0");
}

TEST_F(CoreTest, ANullRowHasNoPublicObject) {
    EXPECT_EQ(Core::getOVObject(nullptr), nullptr);
    EXPECT_EQ(objects.made, 0);
}

TEST_F(CoreTest, MakesThePublicObjectOnce) {
    const Ref<AuthorCore> author = row<AuthorCore>();
    EXPECT_EQ(Core::getOVObject(author.get()), &objects.object);
    EXPECT_EQ(Core::getOVObject(author.get()), &objects.object);
    EXPECT_EQ(objects.made, 1);
    author->clearOVObject(&objects.object);
}

TEST_F(CoreTest, EachClassHasAPublicObjectOfItsOwnKind) {
    EXPECT_EQ(kindOf<ClientCore>(), 1);
    EXPECT_EQ(kindOf<SubscriptionCore>(), 2);
    EXPECT_EQ(kindOf<EntryCore>(), 3);
    EXPECT_EQ(kindOf<ContentCore>(), 4);
    EXPECT_EQ(kindOf<AuthorCore>(), 5);
    EXPECT_EQ(kindOf<EnclosureCore>(), 6);
}

TEST_F(CoreTest, AssertsThatThePublicObjectCouldBeMade) {
    const Ref<AuthorCore> author = row<AuthorCore>();
    objects.fails = true;
    EXPECT_EQ(assertionOf([&] { Core::getOVObject(author.get()); }), "mOVObject");
    const Ref<FeedCore> feed = row<FeedCore>();
    objects.fails = false;
    EXPECT_EQ(assertionOf([&] { Core::getOVObject(feed.get()); }),
              "Can't call getOVObject on a FeedCore!");
    PublicObjects::setCurrent(nullptr);
    EXPECT_EQ(assertionOf([&] { Core::getOVObject(author.get()); }), "mOVObject");
}

TEST_F(CoreTest, DoesNotReplaceAPublicObject) {
    const Ref<AuthorCore> author = row<AuthorCore>();
    FakeObject other;
    author->setOVObject(&objects.object);
    author->setOVObject(&objects.object);
    EXPECT_EQ(
        assertionOf([&] { author->setOVObject(&other); }),
        OVFormat("Core::setOVObject: Can't replace %p with %p",
                 static_cast<const void*>(&objects.object), static_cast<const void*>(&other)));
    EXPECT_EQ(Core::getOVObject(author.get()), &objects.object);
    author->clearOVObject(&objects.object);
}

TEST_F(CoreTest, IsLeftOnlyByItsPublicObject) {
    const Ref<AuthorCore> author = row<AuthorCore>();
    FakeObject other;
    author->setOVObject(&objects.object);
    EXPECT_EQ(assertionOf([&] { author->clearOVObject(&other); }), "ovObject==mOVObject");
    author->clearOVObject(&objects.object);
    author->setOVObject(&other);
    EXPECT_EQ(Core::getOVObject(author.get()), &other);
    author->clearOVObject(&other);
}

TEST_F(CoreTest, LogsItsEnd) {
    const LoggingOn on({&gLogAPIVerbose});
    Ref<AuthorCore> author = row<AuthorCore>();
    const auto* address = static_cast<const void*>(author.get());
    {
        const AutoreleasePool inner;
        author = nullptr;
    }
    EXPECT_TRUE(log.contains(OVFormat("[API.Verbose] Core: deleted %p", address)));
    EXPECT_FALSE(log.contains("is still around!"));
}

TEST_F(CoreTest, WarnsOfAPublicObjectThatOutlivesIt) {
    Ref<AuthorCore> author = row<AuthorCore>();
    author->setOVObject(&objects.object);
    const std::string expected =
        OVFormat("Deleting Orvane::Core[%p] while its OVThing %p is still around!",
                 static_cast<const void*>(author.get()), static_cast<const void*>(&objects.object));
    {
        const AutoreleasePool inner;
        author = nullptr;
    }
    EXPECT_TRUE(log.contains(expected)) << (log.lines().empty() ? "" : log.lines().back());
}

TEST_F(CoreTest, LetsClientsChangeAnyColumn) {
    const Ref<AuthorCore> author = row<AuthorCore>();
    for (const int column : {-1, 0, 3, 1000}) {
        EXPECT_NO_THROW(author->ipcWillChangeColumn(column));
        EXPECT_NO_THROW(author->ipcDidChangeColumn(column));
    }
    EXPECT_NO_THROW(author->preloaded());
    EXPECT_FALSE(author->isChanged());
}
