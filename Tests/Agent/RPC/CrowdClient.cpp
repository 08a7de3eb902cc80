// One of many clients, as a program:
//
//   crowd_client BASE NUMBER CALLS   opens a session on a storage, changes what is its own by so
//                                    many calls, and writes "done". When its input ends, it writes
//                                    "equal" if what it has in memory equals the file within 2
//                                    seconds, and "different" if not.

#include "Agent/RPC/CrowdMember.h"
#include "Support/TurnUntil.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <exception>

namespace {

constexpr double kSettleSeconds = 2;

void tell(const char* word) {
    std::printf("%s\n", word);
    std::fflush(stdout);
}

void run(const char* base, int number, int calls) {
    CrowdMember::openSession(base);
    const CrowdMember member(number);
    for (int i = 0; i < calls; ++i) {
        member.change(i);
    }
    tell("done");
    char byte;
    while (read(STDIN_FILENO, &byte, 1) > 0) {
    }
    const bool isEqual = Support::turnUntil([&] { return member.isEqual(); }, kSettleSeconds);
    tell(isEqual ? "equal" : "different");
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
