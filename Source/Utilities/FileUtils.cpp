#include "Utilities/FileUtils.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/FileErrors.h"
#include "Foundation/Logger.h"
#include "Foundation/UniqueFD.h"
#include "Utilities/DirectoryNames.h"
#include "Utilities/FileRemoval.h"
#include "Utilities/Quarantine.h"
#include "Utilities/Trash.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr auto npos = std::string::npos;
constexpr mode_t kDirectoryMode = 0700;

/// The path of a URL; empty where it has none.
std::string pathOf(const URL* url) {
    return url ? url->getFileSystemRepresentation() : std::string();
}

/// Runs `work`, which gives an `errno`, on the URL's path. Whether it succeeded.
template <class Work>
bool onPath(const URL* url, NetError& error, Work work) {
    const std::string path = pathOf(url);
    error =
        path.empty() ? NetError(NetError::kPFURL, FileURLError::kNotLocal) : fileError(work(path));
    return error.code == 0;
}

/// What the file system tells of a path, or an `errno`; an empty path is EINVAL.
int look(const std::string& path, struct statx& info, unsigned wanted) {
    if (path.empty()) return EINVAL;
    return statx(AT_FDCWD, path.c_str(), 0, wanted, &info) == 0 ? 0 : errno;
}

DateReturner dateOf(const statx_timestamp& time) {
    return Date::date(static_cast<double>(time.tv_sec) - kUnixEpochOffset +
                      static_cast<double>(time.tv_nsec) * 1e-9);
}

bool isDirectory(const std::string& path) {
    struct stat info = {};
    return stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

/// Makes a directory with those above it. One that is there, perhaps since another process made it
/// a moment ago, is as good.
int makeDirectory(const std::string& path) {
    if (mkdir(path.c_str(), kDirectoryMode) == 0) return 0;
    int error = errno;
    if (error == ENOENT) {
        const std::size_t slash = path.rfind('/');
        if (slash != 0 && slash != npos) error = makeDirectory(path.substr(0, slash));
        if (error == 0 && mkdir(path.c_str(), kDirectoryMode) != 0) error = errno;
    }
    return error != 0 && isDirectory(path) ? 0 : error;
}

/// The names in a directory, sorted.
int listDirectory(const std::string& path, std::vector<std::string>& names) {
    UniqueFD directory(open(path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!directory) return errno;
    const int error = DirectoryNames::read(std::move(directory), names);
    std::ranges::sort(names);
    return error;
}

bool isTaken(const std::string& path) {
    struct stat info = {};
    return lstat(path.c_str(), &info) == 0;
}

std::string textWithoutUser(const URL* url) {
    if (!url) return {};
    const Ref<URL> plain = url->getURLWithoutUser();
    const Ref<String> text = plain->getAbsoluteString();
    return text->utf8();
}

std::string textOf(const String* string) {
    return string ? string->utf8() : std::string();
}

/// "Name <mail>", or the one that is there.
std::string describeSender(const String* name, const String* email) {
    if (!name || !email) return textOf(name ? name : email);
    return OVFormat("%@ <%@>", name, email);
}

}  // namespace

bool FileUtils::exists(URL* url) {
    if (!url) return false;
    struct statx info = {};
    const int error = look(pathOf(url), info, STATX_TYPE);
    if (error != 0 && error != ENOENT && error != ENOTDIR) {
        gWarn.log("Checking for existence of %@ failed with error %d", url, error);
    }
    return error == 0;
}

bool FileUtils::createDirectory(URL* newDirURL, NetError& error) {
    OV_ASSERT_AS(newDirURL, "newDirURL");
    OV_ASSERT_AS(newDirURL->hasDirectoryPath(), "newDirURL->hasDirectoryPath()");
    if (onPath(newDirURL, error, makeDirectory)) return true;
    if (error.domain != NetError::kPFURL) error = {NetError::kPFURL, FileURLError::kUnknown};
    return false;
}

bool FileUtils::createDirectory(URL* newDirURL) {
    NetError error;
    if (createDirectory(newDirURL, error)) return true;
    gWarn.log("Failed to create %@, with error %@", newDirURL, error);
    return false;
}

bool FileUtils::move(URL* from, URL* to, NetError& error) {
    const std::string source = pathOf(from), target = pathOf(to);
    error = NetError::None;
    if (source.empty() || target.empty()) {
        error = {NetError::kPOSIX, EINVAL};
    } else if (std::rename(source.c_str(), target.c_str()) != 0) {
        error = {NetError::kPOSIX, errno};
    }
    return error.code == 0;
}

bool FileUtils::move(URL* from, URL* to) {
    NetError ignored;
    return move(from, to, ignored);
}

bool FileUtils::moveToTrash(URL* url, NetError& error) {
    const std::string path = pathOf(url);
    error = {NetError::kPOSIX, path.empty() ? EINVAL : Trash::moveAway(path)};
    if (error.code == 0) error = NetError::None;
    return error.code == 0;
}

bool FileUtils::deleteFile(URL* url, NetError& error) {
    return onPath(url, error, FileRemoval::removeFile);
}

bool FileUtils::deleteFile(URL* url) {
    NetError ignored;
    return deleteFile(url, ignored);
}

std::size_t FileUtils::deleteDirectory(URL* url, NetError& error) {
    std::size_t removed = 0;
    const bool isGone = onPath(url, error, [&](const std::string& path) {
        return FileRemoval::removeDirectory(path, removed);
    });
    return isGone ? removed : 0;
}

URLReturner FileUtils::pathWithUniqueFilenameForPath(URL* url) {
    const std::string path = pathOf(url);
    if (path.empty() || !isTaken(path)) return URLReturner::retained(url);
    const std::size_t nameStart = path.rfind('/') + 1;
    const std::size_t dot = std::min(path.find('.', nameStart), path.size());
    const std::string stem = path.substr(0, dot), extension = path.substr(dot);
    for (unsigned n = 1;; ++n) {
        const std::string next = OVFormat("%s-%u%s", stem, n, extension);
        if (isTaken(next)) continue;
        return URL::urlWithFileSystemPath(next.c_str(), url->hasDirectoryPath());
    }
}

DateReturner FileUtils::getFileModDate(URL* url) {
    struct statx info = {};
    const int error = look(pathOf(url), info, STATX_MTIME);
    if (error == 0) return dateOf(info.stx_mtime);
    gLog.log("FileUtils::getFileModDate(%@) failed with error %d", url, error);
    return nullptr;
}

DateReturner FileUtils::getFileCreationDate(URL* url) {
    struct statx info = {};
    int error = look(pathOf(url), info, STATX_BTIME);
    // Not every file system keeps it.
    if (error == 0 && !(info.stx_mask & STATX_BTIME)) error = ENOTSUP;
    if (error == 0) return dateOf(info.stx_btime);
    gLog.log("FileUtils::getFileCreationDate(%@) failed with error %d", url, error);
    return nullptr;
}

std::int64_t FileUtils::getFileLength(URL* url) {
    struct statx info = {};
    const int error = look(pathOf(url), info, STATX_SIZE);
    if (error == 0) return static_cast<std::int64_t>(info.stx_size);
    gLog.log("FileUtils::getFileLength(%@) failed with error %d", url, error);
    return 0;
}

Returner<FileUtils::ArrayOfURLs> FileUtils::getDirectoryContents(URL* url, NetError& error) {
    std::vector<Ref<URL>> urls;
    const bool isRead = onPath(url, error, [&](const std::string& path) {
        std::vector<std::string> names;
        const int number = listDirectory(path, names);
        for (const std::string& name : names) {
            const std::string item = OVFormat("%s/%s", path, name);
            urls.emplace_back(
                URL::urlWithFileSystemPath(item.c_str(), FileRemoval::isDirectory(item)));
        }
        return number;
    });
    if (isRead) return ArrayOfURLs::arrayFrom(urls);
    gLog.log("FileUtils::getDirectoryContents(%@) failed with error %@", url, error);
    return nullptr;
}

void FileUtils::markQuarantined(URL* file, URL* sourceURL, URL* originURL, String* title,
                                String* senderName, String* senderEmail) {
    const std::string path = pathOf(file);
    const FileOrigin origin = {textWithoutUser(sourceURL), textWithoutUser(originURL),
                               textOf(title), describeSender(senderName, senderEmail)};
    const int error = path.empty() ? EINVAL : Quarantine::mark(path, origin);
    if (error != 0) gLog.log("Got error %d from _PFSetFileQuarantineProperties", error);
}

}  // namespace Orvane
