#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <stdexcept>

namespace Support {

namespace fs = std::filesystem;

TempDir::TempDir() {
    std::string name = (fs::temp_directory_path() / "orvane-test-XXXXXX").string();
    if (!mkdtemp(name.data())) throw std::runtime_error("cannot make " + name);
    mPath = name;
}

TempDir::~TempDir() {
    std::error_code ignored;
    fs::remove_all(mPath, ignored);
}

std::string TempDir::makeDirectory(std::string_view name) const {
    const fs::path directory = mPath / name;
    fs::create_directories(directory);
    fs::permissions(directory, fs::perms::owner_all);
    return directory.string();
}

std::string TempDir::writeFile(std::string_view name, std::string_view content) const {
    const std::string path = *this / name;
    std::ofstream(path, std::ios::binary) << content;
    return path;
}

std::string TempDir::readFile(std::string_view name) const {
    std::ifstream in(*this / name, std::ios::binary);
    EXPECT_TRUE(in) << "cannot read " << name;
    return {std::istreambuf_iterator<char>(in), {}};
}

}  // namespace Support
