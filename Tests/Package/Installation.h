#pragma once

#include "Support/ChildProcess.h"
#include "Support/TempDir.h"

#include <filesystem>
#include <string>
#include <vector>

/// The system installed from this build, in a folder of the test's own. Fails the test if that
/// fails.
class Installation {
 public:
    using Path = std::filesystem::path;

    /// Under a prefix of the folder's.
    Installation();
    /// For a prefix that it is to be moved to later, under a folder that stands for the system's.
    explicit Installation(const std::string& laterPrefix);

    /// A path below the prefix, or below where that is staged.
    Path operator/(const std::string& path) const { return mTop / path; }
    const Path& getTop() const { return mTop; }
    const Support::TempDir& getFolder() const { return mFolder; }

    /// Moves all of it to another prefix.
    void move();

    static std::string contentOf(const Path& file);
    /// All files and links, as paths relative to the prefix, sorted.
    std::vector<std::string> getFiles() const;

 private:
    Support::TempDir mFolder;
    Path mTop;
};

/// Runs a line of shell. Fails the test, with what it wrote, if its status is not 0.
Support::ChildResult shell(const std::string& line);
