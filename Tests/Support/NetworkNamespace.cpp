#include "Support/NetworkNamespace.h"

#include "Support/EnterNamespace.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

namespace Support {

NetworkNamespace::NetworkNamespace() {
    Foundation::UniqueFD outside(open("/proc/self/ns/net", O_RDONLY | O_CLOEXEC));
    switch (enterNamespace(CLONE_NEWNET)) {
        case EnteredNamespace::kDirectly:
            mOutside = std::move(outside);
            break;
        case EnteredNamespace::kInsideNewUser:
            break;
        case EnteredNamespace::kNot:
            mProblem = std::string("no network namespace: ") + std::strerror(errno);
    }
}

NetworkNamespace::~NetworkNamespace() {
    if (!mOutside) return;
    EXPECT_EQ(setns(mOutside.get(), CLONE_NEWNET), 0) << std::strerror(errno);
}

void NetworkNamespace::ip(const std::string& arguments) const {
    const std::string command = "PATH=$PATH:/sbin:/usr/sbin ip " + arguments;
    if (std::system(command.c_str()) != 0) throw std::runtime_error("failed: ip " + arguments);
}

}  // namespace Support
