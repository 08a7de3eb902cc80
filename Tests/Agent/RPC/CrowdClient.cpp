// One of many clients, as a program:
//
//   crowd_client BASE NUMBER CALLS   opens a session on a storage, changes what is its own by so
//                                    many calls, and writes a point for each and then "done". When
//                                    its input ends, it writes "equal" if what it has in memory
//                                    equals the file within 2 seconds, and "different" if not.

#include "Agent/RPC/CrowdMember.h"
#include "Foundation/RunLoop.h"
#include "Foundation/RunLoopSource.h"
#include "Support/TurnUntil.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <exception>

namespace {

constexpr double kSettleSeconds = 2;

void tell(const char* text) {
    std::fputs(text, stdout);
    std::fflush(stdout);
}

void listenUntilInputEnds() {
    Foundation::RunLoop& loop = Foundation::RunLoop::current();
    Foundation::FileDescriptorSource input(STDIN_FILENO);
    input.setReadHandler([&] {
        char byte;
        if (read(STDIN_FILENO, &byte, 1) <= 0) loop.stop();
    });
    input.addTo(loop, Foundation::RunLoop::kDefaultMode);
    loop.run();
}

void run(const char* base, int number, int calls) {
    CrowdMember::openSession(base);
    const CrowdMember member(number);
    for (int i = 0; i < calls; ++i) {
        member.change(i);
        tell(".");
        CrowdMember::listen();
    }
    tell("done\n");
    listenUntilInputEnds();
    const bool isEqual = Support::turnUntil([&] { return member.isEqual(); }, kSettleSeconds);
    tell(isEqual ? "equal\n" : "different\n");
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
