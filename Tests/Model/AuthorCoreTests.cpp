#include "Model/AuthorCore.h"

#include "Model/EntryTest.h"
#include "Model/ModelTest.h"
#include "Model/Values.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

AuthorCore* author(const char* name, const char* email, const char* page) {
    AuthorCore* row = make<AuthorCore>();
    if (name) row->mName.setValue(str(name));
    if (email) row->mEmail.setValue(str(email));
    if (page) row->mURL.setValue(url(page));
    return row;
}

class AuthorCoreTest : public ModelTest {
 protected:
    static AuthorCore* saved(const char* name, const char* email, const char* page) {
        AuthorCore* row = author(name, email, page);
        row->saveChanges();
        return row;
    }
};

}  // namespace

TEST_F(AuthorCoreTest, IsEmptyWithoutNameEmailAndURL) {
    EXPECT_TRUE(author(nullptr, nullptr, nullptr)->isEmpty());
    EXPECT_TRUE(author("", "", nullptr)->isEmpty());
    EXPECT_FALSE(author("Ann", nullptr, nullptr)->isEmpty());
    EXPECT_FALSE(author(nullptr, "a@example.org", nullptr)->isEmpty());
    EXPECT_FALSE(author(nullptr, nullptr, "http://example.org/")->isEmpty());
}

TEST_F(AuthorCoreTest, AContactAloneIsNobody) {
    const Ref<AuthorCore> row = make<AuthorCore>();
    row->mContactBookUID.setValue(str("uid"));
    EXPECT_TRUE(row->isEmpty());
}

TEST_F(AuthorCoreTest, ComparesNameEmailAndURL) {
    const Ref<AuthorCore> ann = author("Ann", "a@example.org", "http://example.org/");
    EXPECT_TRUE(IsContentEqual(ann, author("Ann", "a@example.org", "http://example.org/")));
    EXPECT_FALSE(IsContentEqual(ann, author("Bob", "a@example.org", "http://example.org/")));
    EXPECT_FALSE(IsContentEqual(ann, author("Ann", "b@example.org", "http://example.org/")));
    EXPECT_FALSE(IsContentEqual(ann, author("Ann", "a@example.org", "http://example.org/b")));
    const AuthorCore* none = nullptr;
    EXPECT_TRUE(IsContentEqual(none, none));
    EXPECT_FALSE(IsContentEqual(ann, none));
    EXPECT_FALSE(IsContentEqual(none, ann));
}

TEST_F(AuthorCoreTest, TheContactIsNotCompared) {
    const Ref<AuthorCore> known = author("Ann", nullptr, nullptr);
    known->mContactBookUID.setValue(str("uid"));
    EXPECT_TRUE(IsContentEqual(known, author("Ann", nullptr, nullptr)));
}

TEST_F(AuthorCoreTest, FindsTheRowOfTheSamePerson) {
    saved("Bob", nullptr, nullptr);
    const Ref<AuthorCore> ann = saved("Ann", "a@example.org", "http://example.org/");
    const Ref<AuthorCore> found =
        author("Ann", "a@example.org", "http://example.org/")->findInDatabase();
    EXPECT_EQ(found.get(), ann.get());
}

TEST_F(AuthorCoreTest, FindsNobodyWhoDiffersInOneOfThem) {
    saved("Ann", "a@example.org", "http://example.org/");
    const auto finds = [](const char* name, const char* email, const char* page) {
        const Ref<AuthorCore> found = author(name, email, page)->findInDatabase();
        return found.get() != nullptr;
    };
    EXPECT_FALSE(finds("ann", "a@example.org", "http://example.org/"));
    EXPECT_FALSE(finds("Ann", nullptr, "http://example.org/"));
    EXPECT_FALSE(finds("Ann", "a@example.org", nullptr));
}

TEST_F(AuthorCoreTest, NullAndEmptyAreTheSameWhenSearched) {
    const Ref<AuthorCore> withNull = saved(nullptr, "a@example.org", nullptr);
    const Ref<AuthorCore> found = author("", "a@example.org", nullptr)->findInDatabase();
    EXPECT_EQ(found.get(), withNull.get());
    const Ref<AuthorCore> withEmpty = saved("Bob", "", nullptr);
    const Ref<AuthorCore> other = author("Bob", nullptr, nullptr)->findInDatabase();
    EXPECT_EQ(other.get(), withEmpty.get());
}

TEST_F(AuthorCoreTest, ARowOfATableFindsItself) {
    saved("Ann", nullptr, nullptr);
    const Ref<AuthorCore> twin = saved("Ann", nullptr, nullptr);
    const Ref<AuthorCore> found = twin->findInDatabase();
    EXPECT_EQ(found.get(), twin.get());
}

TEST_F(AuthorCoreTest, FindsNobodyWhileTheDatabaseIsClosed) {
    db().close(true);
    const Ref<AuthorCore> found = author("Ann", nullptr, nullptr)->findInDatabase();
    EXPECT_EQ(found.get(), nullptr);
}

TEST_F(AuthorCoreTest, BecomesTheRowWhereThereIsNone) {
    const Ref<AuthorCore> ann = author("Ann", nullptr, nullptr);
    const Ref<AuthorCore> added = ann->addToDatabase();
    EXPECT_EQ(added.get(), ann.get());
    EXPECT_EQ(count("Authors where name='Ann'"), 1);
    const Ref<AuthorCore> known = author("Ann", nullptr, nullptr)->addToDatabase();
    EXPECT_EQ(known.get(), ann.get());
    EXPECT_EQ(count("Authors"), 1);
}

TEST_F(AuthorCoreTest, AsksTheAgentToMakeTheRow) {
    saved("Bob", nullptr, nullptr);
    reopen(false);
    RecordingAgent agent;
    agent.created = author("created", nullptr, nullptr);
    const Ref<AuthorCore> ann = author("Ann", "a@example.org", "http://example.org/");
    ann->mContactBookUID.setValue(str("uid"));
    Support::LogCapture log;
    const Support::LoggingOn on({&gLogAPI});
    const Ref<AuthorCore> added = ann->addToDatabase();
    EXPECT_EQ(added.get(), agent.created);
    EXPECT_EQ(agent.calls, "createAuthor(Ann,a@example.org,http://example.org/,uid) ");
    EXPECT_TRUE(
        log.contains("[API] Asking agent to add " + textOf(ann->toString()) + " to db ..."));
    EXPECT_TRUE(log.contains("[API] AuthorCore: ...created " + textOf(agent.created->toString())));
    agent.calls.clear();
    const Ref<AuthorCore> bob = author("Bob", nullptr, nullptr)->addToDatabase();
    EXPECT_EQ(bob->getRowID(), 1);
    EXPECT_EQ(agent.calls, "");
}

TEST_F(AuthorCoreTest, SetsItsContactWhereItMayBeChanged) {
    RecordingAgent agent;
    const Ref<AuthorCore> ann = saved("Ann", nullptr, nullptr);
    EXPECT_TRUE(ann->public_setContactBookUID(str("uid")));
    EXPECT_EQ(textOf(ann->mContactBookUID), "uid");
    EXPECT_EQ(agent.calls, "");
}

TEST_F(AuthorCoreTest, AsksTheAgentToSetItsContactAndReadsItAnew) {
    saved("Ann", nullptr, nullptr);
    reopen(false);
    RecordingAgent agent;
    const Ref<AuthorCore> ann = AuthorCore::getRow(1);
    EXPECT_EQ(textOf(ann->mContactBookUID), "(null)");
    EXPECT_TRUE(ann->public_setContactBookUID(str("uid")));
    EXPECT_EQ(agent.calls, "setContactBookUID(1,uid) ");
    EXPECT_FALSE(ann->mContactBookUID.isLoaded());
    EXPECT_TRUE(ann->mName.isLoaded());
}
