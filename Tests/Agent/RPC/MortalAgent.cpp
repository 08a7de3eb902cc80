// The agent, which ends itself as a crash would when it is about to log a certain line:
//
//   mortal_agent FILE   removes the file, and kills itself, at the first line that has the file's
//                       text in it; lives on while there is no such file.

#include "Agent/OVAgentFrameworkMain.h"
#include "Foundation/Logger.h"

#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <fstream>
#include <string>
#include <string_view>

namespace {

class FatalLine : public Foundation::LogSink {
 public:
    explicit FatalLine(const char* file) : mFile(file) {}
    void write(const Foundation::Logger& logger, std::string_view text) override {
        std::ifstream file(mFile);
        std::string fatal;
        if (std::getline(file, fatal) && text.find(fatal) != std::string_view::npos) {
            unlink(mFile);
            kill(getpid(), SIGKILL);
        }
        Foundation::standardErrorSink().write(logger, text);
    }

 private:
    const char* mFile;
};

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    FatalLine fatal(argv[1]);
    Foundation::setLogSink(&fatal);
    // Loggers that were turned on here would ask for preferences before the agent has its name.
    for (const char* variable : {"OVLog", "OVLogAgent", "OVLogIPC"}) {
        setenv(variable, "1", 1);
    }
    return OVAgentFrameworkMain();
}
