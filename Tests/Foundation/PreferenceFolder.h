#pragma once

#include "Foundation/PreferenceFile.h"
#include "Support/EnvVar.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <set>
#include <string>

/// The user's folder of preferences while this lives, and what is found in it: the side of the
/// other processes.
class PreferenceFolder {
 public:
    /// The XML of a property list with these entries, each "<key>…</key><…/>".
    static std::string xml(const std::string& entries) {
        return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n<dict>" +
               entries + "</dict>\n</plist>\n";
    }
    static std::string entry(const std::string& key, const std::string& value) {
        return "<key>" + key + "</key><string>" + value + "</string>";
    }

    std::string path() const { return mDirectory / "orvane"; }
    std::string path(const std::string& domain) const { return path() + "/" + domain + ".plist"; }
    /// Makes the text a domain's file, as another process would: by another file in its place.
    void replace(const std::string& domain, const std::string& content) {
        mDirectory.makeDirectory("orvane");
        const std::string other = mDirectory.writeFile("orvane/.other", content);
        std::filesystem::rename(other, path(domain));
    }
    std::string contentOf(const std::string& domain) const {
        return mDirectory.readFile("orvane/" + domain + ".plist");
    }
    /// The text of a key in a domain's file; empty if there is none.
    std::string textOf(const std::string& domain, const std::string& key) const {
        const auto content = Foundation::PreferenceFile(path(domain)).read();
        auto* text = content.values ? content.values->getAs<Foundation::String>(key) : nullptr;
        return text ? text->utf8() : "";
    }
    bool exists(const std::string& domain) const { return std::filesystem::exists(path(domain)); }
    /// Changes whenever the file is replaced.
    ino_t inodeOf(const std::string& domain) const {
        struct stat info = {};
        EXPECT_EQ(stat(path(domain).c_str(), &info), 0) << "no file of " << domain;
        return info.st_ino;
    }
    /// The names in the folder but that of the lock.
    std::set<std::string> names() const {
        std::set<std::string> found;
        for (const auto& entry : std::filesystem::directory_iterator(path())) {
            found.insert(entry.path().filename().string());
        }
        found.erase(".lock");
        return found;
    }

 private:
    Support::TempDir mDirectory;
    Support::EnvVar mVariable{"XDG_CONFIG_HOME", mDirectory.path().c_str()};
};
