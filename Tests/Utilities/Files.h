#pragma once

#include "Foundation/URL.h"
#include "Support/TempDir.h"

#include <filesystem>
#include <set>
#include <string>
#include <string_view>
#include <vector>

/// A directory for a test of its own, by paths and by URLs.
class Files : public Support::TempDir {
 public:
    /// The URL of a name in the directory; lives as long as this.
    Foundation::URL* url(std::string_view name, bool isDirectory = false) {
        const std::string path = *this / name;
        return mURLs.emplace_back(Foundation::URL::urlWithFileSystemPath(path.c_str(), isDirectory))
            .get();
    }
    /// Any URL; lives as long as this.
    Foundation::URL* other(const char* text) {
        const Foundation::Ref<Foundation::String> string = Foundation::String::string(text);
        return mURLs.emplace_back(Foundation::URL::url(string)).get();
    }

    bool has(std::string_view name) const {
        return std::filesystem::symlink_status(path() / name).type() !=
               std::filesystem::file_type::not_found;
    }
    /// The names of all that is in it, at any depth.
    std::set<std::string> names() const {
        std::set<std::string> result;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(path())) {
            result.insert(entry.path().lexically_relative(path()).string());
        }
        return result;
    }

 private:
    std::vector<Foundation::Ref<Foundation::URL>> mURLs;
};
