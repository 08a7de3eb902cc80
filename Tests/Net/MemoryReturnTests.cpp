#include "Net/MemoryReturn.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>

using namespace Orvane;

// A sanitizer's allocator has rules of its own.
#ifndef __SANITIZE_ADDRESS__

namespace {

constexpr int kDocuments = 200;
constexpr std::size_t kDocumentBytes = 400'000;

long pageFaults() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_minflt;
}

/// How many pages the system has to give anew for one document after the other.
long faultsOfDocuments() {
    long before = 0;
    for (int i = 0; i <= kDocuments; ++i) {
        if (i == 1) before = pageFaults();
        void* document = std::malloc(kDocumentBytes);
        std::fill_n(static_cast<volatile char*>(document), kDocumentBytes, 'x');
        std::free(document);
    }
    return pageFaults() - before;
}

/// What a child says, so that the settings stay its own.
template <class Body>
int inChild(Body body) {
    const pid_t child = fork();
    if (child == 0) _exit(body());
    int status = -1;
    waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace

TEST(MemoryReturn, KeepsRoomFromOneDocumentToTheNext) {
    EXPECT_EQ(inChild([] {
                  MemoryReturn::keepRoomForDocuments();
                  return faultsOfDocuments() < kDocuments ? 0 : 1;
              }),
              0);
}

TEST(MemoryReturn, GivesWhatIsLargeBackAtOnce) {
    EXPECT_EQ(inChild([] {
                  MemoryReturn::keepRoomForDocuments();
                  const std::size_t bytes = std::size_t{8} << 20;
                  char* large = static_cast<char*>(std::malloc(bytes));
                  std::fill_n(static_cast<volatile char*>(large), bytes, 'x');
                  const long before = pageFaults();
                  std::free(large);
                  large = static_cast<char*>(std::malloc(bytes));
                  std::fill_n(static_cast<volatile char*>(large), bytes, 'y');
                  // Every page had gone back, and had to be given anew.
                  return pageFaults() - before >= 3 ? 0 : 1;
              }),
              0);
}

#endif
