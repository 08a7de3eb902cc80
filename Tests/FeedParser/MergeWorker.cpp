// The process that merges and is killed, for the test of what the files then are:
//
//   merge_worker BASE    opens the database of a storage and merges documents into a feed for ever,
//                        those of `RollingDocument`. Writes "merged NUMBER" once the one of that
//                        number is saved.

#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/RollingDocument.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TableOf.h"
#include "Support/LogCapture.h"
#include "Utilities/FileSystem.h"

#include <unistd.h>

#include <cstdio>
#include <exception>
#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

void say(const std::string& line) {
    const std::string text = line + "\n";
    if (write(STDOUT_FILENO, text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
        _exit(3);  // nobody listens any more
    }
}

[[noreturn]] void mergeForEver() {
    const Ref<FeedCore> feed = RollingDocument::storedFeed();
    for (int number = RollingDocument::numberOf(*feed) + 1;; ++number) {
        const AutoreleasePool pool;
        DifferenceEngine engine(feed, false);
        engine.updateFrom(RollingDocument::make(number));
        say("merged " + std::to_string(number));
    }
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    const AutoreleasePool pool;
    FakeCenter noBus;
    const Support::LogCapture quiet;
    try {
        const Ref<URL> base{URL::urlWithFileSystemPath(argv[1], true)};
        Compatibility::FileSystem::setStorageBaseURL(base);
        MinistryOfTruth::instance()->openDatabase();
        mergeForEver();
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "merge_worker: %s\n", exception.what());
    }
    return 1;
}
