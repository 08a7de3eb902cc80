#include "Support/NetworkNamespace.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <stdexcept>

namespace Support {

namespace {

bool write(const char* path, const std::string& text) {
    std::ofstream out(path);
    out << text << std::flush;
    return static_cast<bool>(out);
}

/// Makes the process root of a user namespace and a network namespace of its own.
bool becomeRootOfNewNamespaces() {
    const std::string user = std::to_string(geteuid());
    const std::string group = std::to_string(getegid());
    return unshare(CLONE_NEWUSER | CLONE_NEWNET) == 0 && write("/proc/self/setgroups", "deny") &&
           write("/proc/self/uid_map", "0 " + user + " 1") &&
           write("/proc/self/gid_map", "0 " + group + " 1");
}

}  // namespace

NetworkNamespace::NetworkNamespace() {
    Foundation::UniqueFD outside(open("/proc/self/ns/net", O_RDONLY | O_CLOEXEC));
    if (unshare(CLONE_NEWNET) == 0) {
        mOutside = std::move(outside);
    } else if (!becomeRootOfNewNamespaces()) {
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
