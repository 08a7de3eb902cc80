#include "Model/AuthorIndex.h"

#include "Model/AuthorCore.h"
#include "Model/ModelTest.h"
#include "Model/Values.h"
#include "SQLite/Transaction.h"
#include "Support/LogCapture.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

class AuthorIndexTest : public ModelTest {
 protected:
    static void insert(int rowID, const char* name) {
        db().execute("insert into Authors (rowID, name) values (%d, %Q)", rowID, name);
    }
    RowID find(const char* name) { return index.find({str(name), nullptr, nullptr}); }

    AuthorIndex index{&db()};
};

}  // namespace

TEST_F(AuthorIndexTest, FindsNobodyInAnEmptyTable) {
    EXPECT_EQ(find("Ann"), 0);
    EXPECT_EQ(index.getCount(), 0U);
}

TEST_F(AuthorIndexTest, FindsWhoHasComeSinceTheLastTime) {
    insert(3, "Ann");
    EXPECT_EQ(find("Ann"), 3);
    EXPECT_EQ(find("Bob"), 0);
    insert(5, "Bob");
    EXPECT_EQ(find("Bob"), 5);
    EXPECT_EQ(index.getCount(), 2U);
}

TEST_F(AuthorIndexTest, FindsTheFirstOfSeveral) {
    for (const int rowID : {9, 4, 7}) {
        insert(rowID, "Ann");
    }
    EXPECT_EQ(find("Ann"), 4);
    db().execute("delete from Authors where rowID=4");
    EXPECT_EQ(find("Ann"), 7);
}

TEST_F(AuthorIndexTest, KnowsWhichTextIsWhich) {
    db().execute("insert into Authors (rowID, name, email, url) values (1, 'a', 'b', 'c:d')");
    const URL* page = url("c:d");
    EXPECT_EQ(index.find({str("a"), str("b"), page}), 1);
    EXPECT_EQ(index.find({str("b"), str("a"), page}), 0);
    EXPECT_EQ(index.find({str("a"), str("b"), nullptr}), 0);
    EXPECT_EQ(index.find({nullptr, str("b"), page}), 0);
}

TEST_F(AuthorIndexTest, NullAndEmptyAreTheSame) {
    db().execute("insert into Authors (rowID, email) values (1, 'b')");
    EXPECT_EQ(index.find({str(""), str("b"), nullptr}), 1);
    EXPECT_EQ(index.find({nullptr, str("b"), nullptr}), 1);
}

TEST_F(AuthorIndexTest, ForgetsWhatARollBackTakesAway) {
    insert(1, "Ann");
    EXPECT_EQ(find("Ann"), 1);
    try {
        const Transaction transaction(&db(), true);
        insert(2, "Bob");
        EXPECT_EQ(find("Bob"), 2);
        throw std::runtime_error("on purpose");
    } catch (const std::runtime_error&) {
    }
    EXPECT_EQ(find("Bob"), 0);
    insert(2, "Cid");
    EXPECT_EQ(find("Cid"), 2);
    EXPECT_EQ(find("Ann"), 1);
}

TEST_F(AuthorIndexTest, DoesNotBelieveWhatTheFileDoesNotSay) {
    insert(1, "Ann");
    insert(2, "Bob");
    EXPECT_EQ(find("Ann"), 1);
    db().execute("update Authors set name='Eve' where rowID=1");
    EXPECT_EQ(find("Ann"), 0);
}

TEST_F(AuthorIndexTest, ReadsNoRowTwice) {
    insert(1, "Ann");
    insert(2, "Bob");
    EXPECT_EQ(find("Ann"), 1);
    const Support::LoggingOn on({&gLogSQL});
    const Support::LogCapture log;
    EXPECT_EQ(find("Bob"), 2);
    EXPECT_EQ(find("Cid"), 0);
    for (const std::string& line : log.lines()) {
        EXPECT_EQ(line.find("where rowID>"), std::string::npos) << line;
    }
    EXPECT_FALSE(log.lines().empty());
}
