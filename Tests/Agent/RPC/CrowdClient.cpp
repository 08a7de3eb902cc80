// One of many clients:
//
//   crowd_client BASE NUMBER CALLS  opens a session on a storage, reads all entries, changes what
//   is
//                                   its own by so many calls, and writes "done". When its input
//                                   ends, it writes "equal" if what it has in memory equals the
//                                   file within 2 seconds, and "different" if not.

#include "Agent/Client/IPCClient.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "Support/TurnUntil.h"
#include "Utilities/FileSystem.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <vector>

using namespace Foundation;
using namespace Orvane;

namespace {

constexpr int kOwnEntries = 20;

class CrowdClient {
 public:
    CrowdClient(int number, int calls) : mFirst((number - 1) * kOwnEntries + 1), mCalls(calls) {
        const AutoreleasePool pool;
        for (SQLite::Cursor cursor(SQLite::gDatabase, "select rowID from Entries"); cursor.hasRow();
             cursor.nextRow()) {
            mEntries.emplace_back(EntryCore::getRow(cursor.int64Column(0)));
        }
        for (const Ref<EntryCore>& entry : mEntries) {
            static_cast<void>(entry->mRead.getValue());
        }
    }

    void run() {
        for (int i = 0; i < mCalls; ++i) {
            const AutoreleasePool pool;
            change(i);
        }
    }
    bool isEqual() const {
        const AutoreleasePool pool;
        for (const Ref<EntryCore>& entry : mEntries) {
            const SQLite::Cursor cursor(SQLite::gDatabase,
                                        "select read, flagged from Entries where rowID=%lli",
                                        entry->getRowID());
            if (entry->mRead != (cursor.intColumn(0) != 0)) return false;
            if (entry->mFlagged != (cursor.intColumn(1) != 0)) return false;
        }
        return true;
    }

 private:
    void change(int i) const {
        EntryCore* own = EntryCore::getRow(mFirst + i % kOwnEntries);
        switch (i % 4) {
            case 0:
                own->public_setRead(!own->mRead);
                break;
            case 1:
                own->public_setFlagged(!own->mFlagged);
                break;
            case 2: {
                const SQLite::RowID rows[] = {own->getRowID(), mFirst};
                AgentLink::current().setFlags(rows, 2, i / 4 % 2, -1);
                break;
            }
            default: {
                const Ref<ContentCore> content = Returner<ContentCore>::adopted(new ContentCore);
                content->mMIMEType.setValue(String::string("text/plain"));
                content->mData.setValue(Data::adopt(std::to_string(i)));
                own->setContent(content);
            }
        }
    }

    const int mFirst;
    const int mCalls;
    std::vector<Ref<EntryCore>> mEntries;
};

void tell(const char* word) {
    std::printf("%s\n", word);
    std::fflush(stdout);
}

void run(const char* base, int number, int calls) {
    const AutoreleasePool pool;
    SQLite::Database::initialize();
    const Ref<URL> storage = URL::urlWithFileSystemPath(base, true);
    Compatibility::FileSystem::setStorageBaseURL(storage);
    IPCClient::connect();
    ClientCore::openClientSession();
    CrowdClient client(number, calls);
    client.run();
    tell("done");
    char byte;
    while (read(STDIN_FILENO, &byte, 1) > 0) {
    }
    tell(Support::turnUntil([&] { return client.isEqual(); }, 2) ? "equal" : "different");
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4) return 2;
    try {
        run(argv[1], std::atoi(argv[2]), std::atoi(argv[3]));
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    return 0;
}
