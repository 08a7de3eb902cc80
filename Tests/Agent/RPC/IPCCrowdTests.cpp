// Many clients at once.

#include "Agent/RPC/AgentFixture.h"
#include "Support/PipedChild.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <list>

using namespace Orvane;

using IPCCrowd = AgentFixture;

TEST_F(IPCCrowd, LosesNoCallAndAgreesWithTheFile) {
    const bool isSlow = std::getenv("ORVANE_SLOW_TESTS") != nullptr;
    const int clients = isSlow ? 50 : 5;
    const int calls = isSlow ? 200 : 40;
    SQLite::Database writer;
    writer.open(path.c_str(), true);
    writer.execute(
        "with recursive n(i) as (select 21 union all select i+1 from n where i<%d)"
        " insert into Entries (rowID,identifier,feed,current,read,flagged,localDateCreated)"
        " select i,'e'||i,1,1,0,0,1000 from n",
        clients * 20);
    writer.close(true);
    std::list<Support::PipedChild> children;
    for (int i = 1; i <= clients; ++i) {
        children.emplace_back(std::vector<std::string>{CROWD_CLIENT, base.path().string(),
                                                       std::to_string(i), std::to_string(calls)});
    }
    for (Support::PipedChild& child : children) {
        EXPECT_EQ(child.readLine(), std::string(static_cast<std::size_t>(calls), '.') + "done");
    }
    for (Support::PipedChild& child : children) {
        child.closeInput();
    }
    for (Support::PipedChild& child : children) {
        EXPECT_EQ(child.readLine(), "equal");
        EXPECT_EQ(child.wait(), 0);
    }
    // Each client's entries were changed alike, so one that misses a call would differ.
    EXPECT_EQ(inFile("select count(distinct line) from (select group_concat(read||flagged||"
                     "ifnull((select cast(data as text) from Contents c where c.rowID=content),'')"
                     ", ' ') as line from (select * from Entries order by rowID)"
                     " group by (rowID-1)/20)"),
              1);
    EXPECT_GT(inFile("select count(*) from Contents"), 0);
}
