#include "Utilities/FileSystem.h"

#include "Foundation/AssertionFailure.h"
#include "Utilities/FileIcons.h"

#include <pwd.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <vector>

namespace Compatibility {

using namespace Foundation;

namespace {

// Plain pointers, each with a reference of its own, which stay until the process ends: the tree
// must not go before the last of those who write to it.
URL* sStorageBaseURL = nullptr;
URL* sStorageURL = nullptr;
URL* sStorageTruthURL = nullptr;
Bundle* sClientBundle = nullptr;

/// Puts what `returner` holds into `place` and lets go of what was there.
template <class T>
void store(T*& place, Returner<T> returner) {
    Foundation::release(std::exchange(place, returner.detach()));
}

URLReturner append(URLReturner base, const char* name, bool isDirectory) {
    const Ref<URL> directory = std::move(base);
    const Ref<String> component = String::string(name);
    return directory->byAppending(component, isDirectory);
}

bool isAbsolute(const char* path) {
    return path && *path == '/';
}

/// The home that the user's account names; empty if there is no account.
std::string accountHome() {
    constexpr std::size_t kLargest = 1 << 20;
    passwd entry = {};
    passwd* found = nullptr;
    std::vector<char> buffer(1024);
    while (getpwuid_r(getuid(), &entry, buffer.data(), buffer.size(), &found) == ERANGE &&
           buffer.size() < kLargest) {
        buffer.resize(buffer.size() * 2);
    }
    return found && found->pw_dir ? found->pw_dir : "";
}

URLReturner findStorageBaseURL() {
    const std::string path = FileSystem::findDataDirectory(
        std::getenv("XDG_DATA_HOME"), std::getenv("HOME"), accountHome().c_str());
    return URL::urlWithFileSystemPath(path.c_str(), true);
}

}  // namespace

std::string FileSystem::findDataDirectory(const char* xdgDataHome, const char* home,
                                          const char* accountHome) {
    if (isAbsolute(xdgDataHome)) return xdgDataHome;
    for (const char* directory : {home, accountHome}) {
        if (isAbsolute(directory)) return std::string(directory) + "/.local/share";
    }
    return {};
}

void FileSystem::setStorageBaseURL(URL* url) {
    store(sStorageBaseURL, URLReturner::retained(url));
    store<URL>(sStorageURL, nullptr);
    store<URL>(sStorageTruthURL, nullptr);
}

URLReturner FileSystem::getStorageBaseURL() {
    if (!sStorageBaseURL) store(sStorageBaseURL, findStorageBaseURL());
    OV_ASSERT_MESSAGE_AS(sStorageBaseURL, "sStorageBaseURL",
                         "Couldn't locate user's Library directory!");
    return URLReturner::retained(sStorageBaseURL);
}

URLReturner FileSystem::getStorageURL() {
    if (!sStorageURL) store(sStorageURL, append(getStorageBaseURL(), "Orvane", true));
    return URLReturner::retained(sStorageURL);
}

URLReturner FileSystem::getStorageDatabaseURL() {
    return append(getStorageURL(), "Database", true);
}

URLReturner FileSystem::getStorageDatabaseFile() {
    return append(getStorageDatabaseURL(), "Database.sqlite3", false);
}

URLReturner FileSystem::getClientPListURL() {
    return append(getStorageURL(), "Clients.plist", false);
}

URLReturner FileSystem::getStorageTruthURL() {
    if (!sStorageTruthURL) store(sStorageTruthURL, append(getStorageURL(), "Feeds", true));
    return URLReturner::retained(sStorageTruthURL);
}

URLReturner FileSystem::getStorageEnclosuresURL() {
    return append(getStorageURL(), "Downloads", true);
}

URLReturner FileSystem::getStorageIncompleteEnclosuresURL() {
    return append(getStorageEnclosuresURL(), "Incomplete", true);
}

Bundle* FileSystem::getFrameworkBundle() {
    return Bundle::frameworkBundle();
}

Bundle* FileSystem::getClientBundle() {
    return sClientBundle ? sClientBundle : getFrameworkBundle();
}

void FileSystem::setClientBundle(Bundle* bundle) {
    store(sClientBundle, Returner<Bundle>::retained(bundle));
}

URLReturner FileSystem::getTempURL() {
    return URL::urlWithFileSystemPath("/tmp", true);
}

URLReturner FileSystem::getFileIconURL(String* type, String* name) {
    const std::string path = Orvane::FileIcons::find(type ? type->utf8() : std::string(),
                                                     name ? name->utf8() : std::string());
    return URL::urlWithFileSystemPath(path.c_str(), false);
}

URLReturner FileSystem::getLocalFileIconURL(URL* file) {
    const Ref<String> name = file ? file->getLastPathComponent() : nullptr;
    return name ? getFileIconURL(nullptr, name) : nullptr;
}

}  // namespace Compatibility
