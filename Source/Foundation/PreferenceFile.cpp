#include "Foundation/PreferenceFile.h"

#include "Foundation/AtomicFile.h"
#include "Foundation/Data.h"
#include "Foundation/PropertyList.h"
#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <glib.h>
#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace Foundation {

namespace {

std::string homeFolder() {
    const char* home = std::getenv("HOME");
    if (home && *home == '/') return home;
    // Not `getpwuid`: a log on another thread may get here.
    passwd entry = {};
    passwd* user = nullptr;
    char texts[4096];
    getpwuid_r(getuid(), &entry, texts, sizeof texts, &user);
    return user && user->pw_dir ? user->pw_dir : "/";
}

std::string configurationFolder() {
    const char* folder = std::getenv("XDG_CONFIG_HOME");
    // The base directory specification has relative values ignored.
    return folder && *folder == '/' ? folder : homeFolder() + "/.config";
}

std::string escaped(std::string_view domain) {
    constexpr char kDigits[] = "0123456789ABCDEF";
    std::string name;
    for (const char c : domain) {
        const bool isInnerDot = c == '.' && !name.empty();
        if (g_ascii_isalnum(c) || c == '-' || c == '_' || isInnerDot) {
            name += c;
        } else {
            const auto byte = static_cast<unsigned char>(c);
            name += {'%', kDigits[byte / 16], kDigits[byte % 16]};
        }
    }
    // An empty name would give a hidden file.
    return name.empty() ? "%" : name;
}

PreferenceFile::Content damaged(std::string reason) {
    return {.state = PreferenceFile::State::Damaged, .reason = std::move(reason)};
}

/// Why the file could not be opened or read. What will not pass by itself counts as damage.
PreferenceFile::Content unreadable(int error) {
    using State = PreferenceFile::State;
    switch (error) {
        case ENOENT:
            return {};
        case EACCES:
        case EPERM:
        case EISDIR:
        case ELOOP:
        case EIO:
            return damaged(std::strerror(error));
        default:
            return {.state = State::Failed, .error = error, .reason = std::strerror(error)};
    }
}

/// Reads all of a file. Gives 0 or an `errno`.
int readAll(int fd, std::string& text) {
    char block[16384];
    for (;;) {
        const ssize_t length = ::read(fd, block, sizeof block);
        if (length == 0) return 0;
        if (length > 0) {
            text.append(block, static_cast<std::size_t>(length));
        } else if (errno != EINTR) {
            return errno;
        }
    }
}

bool isRegularFile(int fd) {
    struct stat info = {};
    return fstat(fd, &info) == 0 && S_ISREG(info.st_mode);
}

}  // namespace

std::string PreferenceFile::pathOfDomain(std::string_view domain) {
    return configurationFolder() + "/orvane/" + escaped(domain) + ".plist";
}

std::string PreferenceFile::getFolder() const {
    return mPath.substr(0, mPath.rfind('/'));
}

PreferenceFile::Content PreferenceFile::read() const {
    // Without O_NONBLOCK a pipe of this name would block for ever.
    const UniqueFD fd(open(mPath.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    if (!fd) return unreadable(errno);
    std::string text;
    if (!isRegularFile(fd.get())) return damaged("it is no file");
    if (const int error = readAll(fd.get(), text)) return unreadable(error);
    std::string wrong;
    const Ref<PFRefCounted> root = PropertyList::read(Bytes(text), &wrong);
    auto* dictionary = dynamic_cast<Dictionary*>(root.get());
    if (!dictionary) return damaged(root ? "it holds no dictionary" : wrong);
    return {.state = State::Read, .values = dictionary};
}

int PreferenceFile::write(const Dictionary& values) const {
    const Ref<Data> xml = PropertyList::write(&values);
    return xml ? AtomicFile::write(mPath, xml->view()) : EINVAL;
}

int PreferenceFile::setAside(std::string& newPath) const {
    constexpr int kMostNames = 1000;
    for (int i = 1; i <= kMostNames; ++i) {
        newPath = mPath + ".damaged" + (i > 1 ? "-" + std::to_string(i) : "");
        if (renameat2(AT_FDCWD, mPath.c_str(), AT_FDCWD, newPath.c_str(), RENAME_NOREPLACE) == 0) {
            return 0;
        }
        if (errno != EEXIST) return errno;
    }
    return EEXIST;
}

}  // namespace Foundation
