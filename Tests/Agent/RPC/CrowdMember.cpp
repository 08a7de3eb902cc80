#include "Agent/RPC/CrowdMember.h"

#include "Agent/Client/IPCClient.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "Utilities/FileSystem.h"

#include <string>

using namespace Foundation;
using namespace Orvane;

void CrowdMember::openSession(const char* base) {
    const AutoreleasePool pool;
    SQLite::Database::initialize();
    const Ref<URL> storage = URL::urlWithFileSystemPath(base, true);
    Compatibility::FileSystem::setStorageBaseURL(storage);
    IPCClient::connect();
    ClientCore::openClientSession();
}

CrowdMember::CrowdMember(int number) : mFirst((number - 1) * kOwnEntries + 1) {
    const AutoreleasePool pool;
    for (SQLite::Cursor cursor(SQLite::gDatabase, "select rowID from Entries"); cursor.hasRow();
         cursor.nextRow()) {
        mEntries.emplace_back(EntryCore::getRow(cursor.int64Column(0)));
    }
    for (const Ref<EntryCore>& entry : mEntries) {
        static_cast<void>(entry->mRead.getValue());
    }
}

void CrowdMember::change(int i) const {
    const AutoreleasePool pool;
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

void CrowdMember::listen() {
    const auto turn = [] { return RunLoop::current().runInMode(RunLoop::kDefaultMode, 0, true); };
    while (turn() != RunLoop::Result::TimedOut) {
    }
}

bool CrowdMember::isEqual() const {
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
