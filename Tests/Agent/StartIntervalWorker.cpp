// A service that works as often as the service manager starts it:
//
//   start_interval_worker FILE SECONDS...   adds a line to the file, and asks to be started again
//                                           after the first of the seconds, the next time after
//                                           the second, and so on; not any more behind the last

#include "Agent/UserServiceManager.h"
#include "Foundation/AutoreleasePool.h"

#include <cstdlib>
#include <fstream>
#include <string>

namespace {

int countLines(const char* file) {
    std::ifstream lines(file);
    int count = 0;
    for (std::string line; std::getline(lines, line);) {
        ++count;
    }
    return count;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 3) return 2;
    const Foundation::AutoreleasePool pool;
    const int run = countLines(argv[1]);
    Orvane::UserServiceManager manager;
    int error = 0;
    for (int i = run; i < argc - 2; ++i) {
        // Each replaces the one before, so that the first of what is left counts in the end.
        const int index = argc - 1 - (i - run);
        error = manager.setStartInterval(std::atoll(argv[index]));
        if (error != 0) break;
    }
    std::ofstream(argv[1], std::ios::app)
        << (manager.isManaged() ? "managed " : "") << error << '\n';
    return error;
}
