// The agent's part in the tests of a client's session:
//
//   session_agent BASE STEP...  takes the agent's name, opens the database of a storage, whatever
//                               that takes, and does the steps, each of which is saved:
//
//   client SIGNATURE    makes a client, and writes its row ID
//   subscribe URL       subscribes the first client to a new feed
//   use                 notes that the first client is in use
//   replace             moves the database away and makes another

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Utilities/FileSystem.h"

#include <cstdio>
#include <stdexcept>
#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

void subscribe(const char* address) {
    const Ref<FeedCore> feed = Returner<FeedCore>::adopted(new FeedCore);
    feed->mURL.setValue(URL::url(String::string(address)));
    feed->getIdentifier();
    const Ref<ClientCore> client = ClientCore::getRow(1);
    const Ref<SubscriptionCore> made = client->createSubscription(feed, nullptr);
}

void step(const std::string& command, const char* argument) {
    const AutoreleasePool pool;
    if (command == "client") {
        const Ref<ClientCore> client = ClientCore::createClient(String::string(argument));
        std::printf("%lli\n", client->getRowID());
    } else if (command == "subscribe") {
        subscribe(argument);
    } else if (command == "use") {
        ClientCore::getRow(1)->markInUse();
    } else if (command == "replace") {
        MinistryOfTruth::instance()->saveSubscriptions();
        MinistryOfTruth::instance()->recoverBrokenDatabase(nullptr);
    } else {
        throw std::runtime_error("what is '" + command + "'?");
    }
    SQLite::gDatabase->saveRows();
}

void run(const char* base, int count, char** steps) {
    const AutoreleasePool pool;
    const Ref<URL> storage = URL::urlWithFileSystemPath(base, true);
    Compatibility::FileSystem::setStorageBaseURL(storage);
    MinistryOfTruth::instance()->openDatabase();
    for (int i = 0; i < count; i += 2) {
        step(steps[i], i + 1 < count ? steps[i + 1] : "");
    }
    SQLite::gDatabase->close(true);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2 || !Bus::user().requestName(BusCenter::kAgentName)) return 2;
    try {
        run(argv[1], argc - 2, argv + 2);
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    return Bus::user().flush(60) ? 0 : 1;
}
