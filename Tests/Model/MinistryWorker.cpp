// The agent's part that is killed, for the tests of what the files then are. Each mode writes a
// line "ready" once it begins:
//
//   ministry_worker open BASE       opens the database of a storage, whatever that takes, and
//                                   writes "done"
//   ministry_worker subscribe BASE  opens it and subscribes for ever: in each turn commits the
//                                   subscription of the next number, to the feed of that number,
//                                   and writes "committed NUMBER"; then saves the file of clients
//                                   and writes "saved NUMBER"

#include "Foundation/Switches.h"
#include "Foundation/URL.h"
#include "Model/LineFeeding.h"
#include "Model/MinistryOfTruth.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
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

[[noreturn]] void subscribeForEver() {
    int number = gDatabase->execScalar("select count(*) from Subscriptions");
    for (;;) {
        const AutoreleasePool pool;
        ++number;
        subscribe(number);
        say("committed " + std::to_string(number));
        MinistryOfTruth::instance()->saveSubscriptions();
        say("saved " + std::to_string(number));
    }
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
        if (std::string(argv[1]) == "subscribe") subscribeForEver();
        say("done");
        gDatabase->close(true);
        return 0;
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
    }
    return 4;
}
