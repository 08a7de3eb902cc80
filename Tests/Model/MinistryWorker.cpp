// The agent's part that is killed, for the tests of what the files then are. Each mode writes a
// line "ready" once it begins:
//
//   ministry_worker open BASE       opens the database of a storage, whatever that takes, and
//                                   writes "done"
//   ministry_worker subscribe BASE  opens it and subscribes for ever: in each turn commits the
//                                   subscription of the next number, to the feed of that number,
//                                   and writes "committed NUMBER"; then saves the file of clients
//                                   and writes "saved NUMBER"
//   ministry_worker request BASE    the same, but only asks for the file to be saved soon, before
//                                   it writes "committed NUMBER"
//   ministry_worker delete BASE     opens it and deletes the subscriptions one after the other, and
//                                   with each its feed, and writes "deleted ROWID" for each, and
//                                   "done"

#include "Foundation/ArrayOf.h"
#include "Foundation/Switches.h"
#include "Foundation/URL.h"
#include "Model/LineFeeding.h"
#include "Model/MinistryOfTruth.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"
#include "Support/LogCapture.h"
#include "Utilities/FileSystem.h"

#include <unistd.h>

#include <cstdio>
#include <optional>
#include <string>

using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

void say(const std::string& line) {
    const std::string text = line + "\n";
    if (write(STDOUT_FILENO, text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
        _exit(3);  // nobody listens any more
    }
}

void subscribe(int number) {
    const SQLite::Transaction transaction(true);
    gDatabase->execute("insert or ignore into Clients values (1, 'com.example.reader', 0, 1)");
    gDatabase->execute("insert into Feeds (rowID, url) values (%d, 'http://example.com/%d')",
                       number, number);
    gDatabase->execute("insert into Subscriptions (rowID, client, feed) values (%d, 1, %d)", number,
                       number);
}

[[noreturn]] void subscribeForEver(bool onlyRequests) {
    int number = gDatabase->execScalar("select count(*) from Subscriptions");
    for (;;) {
        const AutoreleasePool pool;
        ++number;
        subscribe(number);
        if (onlyRequests) MinistryOfTruth::instance()->saveSubscriptionsSoon();
        say("committed " + std::to_string(number));
        if (onlyRequests) continue;
        MinistryOfTruth::instance()->saveSubscriptions();
        say("saved " + std::to_string(number));
    }
}

void deleteSubscriptions() {
    const auto query = SQLite::TableOf<SubscriptionCore>::instance()->allRows();
    const Ref<ArrayOf<SubscriptionCore>> subscriptions = query->allRows();
    for (SubscriptionCore* subscription : *subscriptions) {
        const AutoreleasePool pool;
        const SQLite::RowID rowID = subscription->getRowID();
        subscription->deleteRow();
        say("deleted " + std::to_string(rowID));
    }
}

void work(const std::string& mode) {
    if (mode == "subscribe" || mode == "request") subscribeForEver(mode == "request");
    if (mode == "delete") deleteSubscriptions();
}

void useStorage(const char* path) {
    const Ref<URL> url{URL::urlWithFileSystemPath(path, true)};
    Compatibility::FileSystem::setStorageBaseURL(url);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) return 2;
    const AutoreleasePool pool;
    FakeCenter noBus;
    LineFeeding feeding;
    // What it says is looked at only where it ends by itself.
    std::optional<Support::LogCapture> quiet;
    if (!GetBoolEnv("OVAgentQuitAfterRecovery")) quiet.emplace();
    try {
        useStorage(argv[2]);
        say("ready");
        MinistryOfTruth::instance()->openDatabase();
        work(argv[1]);
        say("done");
        gDatabase->close(true);
        return 0;
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
    }
    return 4;
}
