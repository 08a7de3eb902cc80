#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace Support {

/// A directory of the test's own (mode 0700), removed with all it holds when this ends.
class TempDir {
 public:
    TempDir();
    ~TempDir();
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    const std::filesystem::path& path() const { return mPath; }
    std::string operator/(std::string_view name) const { return (mPath / name).string(); }

    /// Makes a directory in it, with mode 0700, and gives its path.
    std::string makeDirectory(std::string_view name) const;
    /// Writes a file in it and gives its path.
    std::string writeFile(std::string_view name, std::string_view content) const;
    /// The content of a file in it. Fails the test if it cannot be read.
    std::string readFile(std::string_view name) const;

 private:
    std::filesystem::path mPath;
};

}  // namespace Support
