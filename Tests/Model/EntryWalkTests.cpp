// What a walk over many entries takes.

#include "Foundation/URL.h"
#include "Model/EntryCore.h"
#include "Model/ModelTest.h"
#include "SQLite/CursorOf.h"

#include <malloc.h>

#include <algorithm>
#include <cstdlib>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

class EntryWalkTest : public ModelTest {
 protected:
    EntryWalkTest() {
        // Few pages, so that sqlite3's own cache is full at once.
        db().execute("PRAGMA cache_size = 10");
        db().execute(
            "with n(i) as (select 1 union all select i + 1 from n where i < %d) "
            "insert into Entries (identifier, title, alternateUrl, dateUpdated, timeZoneUpdated) "
            "select 'entry ' || i, 'The title of entry ' || i, 'http://example.org/' || i, i, "
            "cast('Europe/Berlin' as blob) from n",
            kEntries);
    }
    /// Reads the entries, with a pool for each, and gives the most memory that was in use between
    /// two of them.
    static std::size_t walk(const char* where) {
        std::size_t most = 0;
        int count = 0;
        for (CursorOf<EntryCore> cursor(TableOf<EntryCore>::instance()->rowsWhere(where));
             cursor.hasRow(); cursor.nextRow()) {
            {
                const AutoreleasePool inner;
                const Ref<EntryCore> entry = cursor.row();
                EXPECT_TRUE(entry->mTitle.getValue() && entry->mAlternateURL.getValue() &&
                            entry->mDateUpdated.getValue() && entry->mTimeZoneUpdated.getValue());
            }
            if (++count % 100 == 0) most = std::max(most, mallinfo2().uordblks);
        }
        EXPECT_GE(count, 100);
        return most;
    }

    const int kEntries = std::getenv("ORVANE_SLOW_TESTS") ? 1'000'000 : 10'000;
};

}  // namespace

TEST_F(EntryWalkTest, DoesNotGrowTheProcess) {
    const std::size_t few = walk("rowID <= 1000");
    const std::size_t all = walk("1");
    // Less than a few bytes for each row.
    EXPECT_LE(all, few + 32 * 1024);
    EXPECT_EQ(TableOf<EntryCore>::instance()->getCachedRowCount(), 0U);
}
