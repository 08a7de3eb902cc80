#include "SQLite/Database.h"
#include "SQLite/SQLFunctionPort.h"
#include "SQLite/StoreTest.h"

#include <stdexcept>

using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using DatabaseTest = StoreTest;

class Doubler : public SQLFunctionPort {
 public:
    Doubler() { setCurrent(this); }
    ~Doubler() override { setCurrent(nullptr); }
    void installFunctions(SQLFunctionInstaller& installer) override {
        installer.add("twice", -1, [](SQLFunctionCall& call) {
            if (call.getArgumentCount() != 1) throw std::runtime_error("one, please");
            if (!call.getText(0)) return call.setNullResult();
            call.setResult(2 * call.getInteger(0));
        });
    }
};

/// Asks for more arguments than sqlite3 allows.
class Refused : public SQLFunctionPort {
 public:
    Refused() { setCurrent(this); }
    ~Refused() override { setCurrent(nullptr); }
    void installFunctions(SQLFunctionInstaller& installer) override {
        added = installer.add("refused", 1000, [](SQLFunctionCall&) {});
    }
    bool added = true;
};

}  // namespace

TEST_F(DatabaseTest, InstallsTheFunctionsOfThePort) {
    const Doubler port;
    reopen(true);
    EXPECT_EQ(db().execScalar("select twice(21)"), 42);
    EXPECT_EQ(db().execScalar("select twice(null) is null"), 1);
    // The schema may not call it.
    db().execute("create view v as select twice(1) as a");
    LogCapture log;
    EXPECT_EQ(codeOf([] { db().execScalar("select a from v"); }), 1);
    EXPECT_TRUE(log.contains("unsafe use of twice()"));
    // What it throws is reported and goes no further.
    EXPECT_EQ(db().execScalar("select twice(1, 2) is null"), 1);
    EXPECT_TRUE(log.contains("one, please"));
}

TEST_F(DatabaseTest, OpensWithoutAFunctionThatSqliteRefuses) {
    const Refused port;
    const LoggingOn on({});
    LogCapture log;
    reopen(true);
    EXPECT_FALSE(port.added);
    EXPECT_TRUE(log.contains("Database: sqlite3_create_function returned error 21"));
    EXPECT_TRUE(db().isOpen());
}
