#include "Package/Installation.h"

#include "Support/EnvVar.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>

namespace fs = std::filesystem;

namespace {

/// One after the other: all write the list of what was installed last into the build folder.
void install(const std::string& prefix) {
    shell("flock " ORVANE_BUILD "/install.lock " ORVANE_CMAKE " --install " ORVANE_BUILD
          " --prefix '" +
          prefix + "'");
}

}  // namespace

Installation::Installation() : mTop(mFolder.path() / "prefix") {
    install(mTop);
}

Installation::Installation(const std::string& laterPrefix)
    : mTop(mFolder.path() / "stage" / laterPrefix.substr(1)) {
    const Support::EnvVar stage("DESTDIR", (mFolder / "stage").c_str());
    install(laterPrefix);
}

void Installation::move() {
    const fs::path moved = mFolder.path() / "moved";
    fs::rename(mTop, moved);
    mTop = moved;
}

std::string Installation::contentOf(const Path& file) {
    std::ifstream stream(file, std::ios::binary);
    EXPECT_TRUE(stream) << file;
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

std::vector<std::string> Installation::getFiles() const {
    std::vector<std::string> files;
    for (const fs::directory_entry& each : fs::recursive_directory_iterator(mTop)) {
        if (!each.is_directory()) files.push_back(each.path().lexically_relative(mTop));
    }
    std::sort(files.begin(), files.end());
    return files;
}

Support::ChildResult shell(const std::string& line) {
    Support::ChildResult result = Support::runChild({"/bin/sh", "-c", line});
    EXPECT_EQ(result.status, 0) << line << "\n" << result.out << result.err;
    return result;
}
