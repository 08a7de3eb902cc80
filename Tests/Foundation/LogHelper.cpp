// A program for tests of what the log decides once for a process. Its arguments are carried out
// one after the other:
//
//   --journal       go behind a journal of its own, and print its messages at the end; ends with
//                   status 77 if that is not possible
//   NAME=VALUE      set an environment variable
//   on NAME         print whether the facility will log; the empty name is the general log
//   write NAME TEXT write a line on the facility
//   public TEXT     write a line by the public functions
//   fail, fail-with let an assertion fail, without and with a message
//   stack SKIP N    print the stack from 20 calls deep

#include <Orvane/OVLog.h>

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/Utils.h"
#include "Support/ManualClock.h"
#include "Support/PrivateJournal.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <optional>
#include <string>

using namespace Foundation;

// Functions that the stack is to show: each has a name that it can see and a frame of its own.
#ifdef __clang__
#define SHOWN extern "C" __attribute__((noinline, optnone, visibility("default")))
#else
// Nor may a part of it stand apart under another name.
#define SHOWN  \
    extern "C" \
        __attribute__((noipa, visibility("default"), optimize("no-reorder-blocks-and-partition")))
#endif

SHOWN void functionThatFails() {
    OV_ASSERT_AS(false, "x > 0");
}

SHOWN void functionThatFailsWithAMessage(int number) {
    OV_ASSERT_MESSAGE_AS(number < 0, "x > 0", "x is %d", number);
}

SHOWN void functionThatPrints(int skip, int count) {
    Compatibility::Utils::printStack(skip, count);
    std::fputs("end\n", stderr);  // so that the call above does not end the function
}

SHOWN void functionThatGoesDeeper(int depth, int skip, int count) {
    if (depth == 0) {
        functionThatPrints(skip, count);
    } else {
        functionThatGoesDeeper(depth - 1, skip, count);
    }
    std::fflush(stderr);  // the same
}

namespace {

constexpr double kDate = 794293567.089;  // 2026-03-04 05:06:07.089 GMT
constexpr int kSkipped = 77;

Logger& facility(const std::string& name) {
    static std::map<std::string, Logger> sOthers;
    if (name.empty()) return gLog;
    for (Logger* logger : {&gWarn, &SQLite::gLogSQL, &SQLite::gLogTruth, &Orvane::gLogFeed}) {
        if (name == logger->mName) return *logger;
    }
    const auto other = sOthers.try_emplace(name).first;
    other->second.mName = other->first.c_str();
    return other->second;
}

template <class Function>
void report(Function&& fails) {
    try {
        fails();
    } catch (const AssertionFailure& e) {
        std::printf("%s\n", e.what());
    }
}

void print(Support::PrivateJournal& journal) {
    for (const auto& message : journal.takeMessages()) {
        for (const auto& [key, value] : message) {
            std::printf("%s=%s\n", key.c_str(), value.c_str());
        }
        std::printf("\n");
    }
}

/// Carries out the command at `word`, and gives the next one.
char** carryOut(char** word) {
    const std::string command = *word++;
    if (command == "on") {
        std::printf("%d\n", facility(*word++).willLog());
    } else if (command == "write") {
        Logger& logger = facility(*word++);
        logger.log("%s", *word++);
    } else if (command == "public") {
        AlwaysWarn("%s", *word++);
    } else if (command == "fail") {
        report(functionThatFails);
    } else if (command == "fail-with") {
        report([] { functionThatFailsWithAMessage(3); });
    } else if (command == "stack") {
        const int skip = std::atoi(*word++);
        functionThatGoesDeeper(20, skip, std::atoi(*word++));
    } else {
        const std::size_t equals = command.find('=');
        setenv(command.substr(0, equals).c_str(), command.substr(equals + 1).c_str(), 1);
    }
    return word;
}

}  // namespace

int main(int, char** argv) {
    char** word = argv + 1;
    std::optional<Support::PrivateJournal> journal;
    if (*word && std::strcmp(*word, "--journal") == 0) {
        ++word;
        journal.emplace();
        if (!journal->problem().empty()) {
            std::puts(journal->problem().c_str());
            return kSkipped;
        }
    }
    const Support::ManualClock clock(kDate);
    while (*word) {
        word = carryOut(word);
    }
    if (journal) print(*journal);
    return 0;
}
