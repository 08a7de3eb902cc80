#include "CommandLine.h"

#include <clocale>
#include <cstdlib>

int main(int argc, char** argv) {
    std::setlocale(LC_CTYPE, "");
    // What the library has to report is for its log; what concerns the user is said here.
    setenv("OVUseSystemLog", "1", 0);
    const std::vector<std::string> words(argv + (argc > 0 ? 1 : 0), argv + argc);
    return static_cast<int>(Commands::CommandLine().run(words));
}
