// What values do with the files that URLs name.

#include "Foundation/AssertionFailure.h"
#include "Foundation/AtomicFile.h"
#include "Foundation/Data.h"
#include "Foundation/FileErrors.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <glib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <string>

namespace Foundation {

namespace {

constexpr std::size_t kBlock = 65536;

/// Reads all of the file at `path`. Gives 0 or an `errno`.
int readFile(const std::string& path, std::string& content) {
    // A pipe that nobody writes to must not hold the process up, neither here nor in `read`.
    const UniqueFD fd(open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    struct stat info = {};
    if (!fd || fstat(fd.get(), &info) != 0) return errno;
    if (S_ISDIR(info.st_mode)) return EISDIR;
    if (!S_ISREG(info.st_mode)) return EINVAL;

    // The size is a hint only: files of /proc have none, and others may grow while they are read.
    std::size_t length = 0;
    content.resize(static_cast<std::size_t>(info.st_size) + 1);
    for (;;) {
        if (length == content.size()) content.resize(length + std::max(length, kBlock));
        const ssize_t got = read(fd.get(), content.data() + length, content.size() - length);
        if (got < 0 && errno == EINTR) continue;
        if (got < 0) return errno;
        if (got == 0) break;
        length += static_cast<std::size_t>(got);
    }
    content.resize(length);
    return 0;
}

/// The path of a URL; empty, with the error, where it has none.
std::string pathOf(const URL* url, NetError& error) {
    std::string path = url->getFileSystemRepresentation();
    error = path.empty() ? NetError(NetError::kPFURL, FileURLError::kNotLocal) : NetError::None;
    return path;
}

}  // namespace

DataReturner Data::dataFromResource(URL* url, NetError& error) {
    OV_ASSERT_AS(url != nullptr, "url!=NULL");
    const std::string path = pathOf(url, error);
    std::string content;
    if (error.code == 0) error = fileError(readFile(path, content));
    if (error.code != 0) return nullptr;
    return adopt(std::move(content));
}

DataReturner Data::dataFromResource(URL* url) {
    NetError ignored;
    return dataFromResource(url, ignored);
}

bool Data::writeToResource(URL* url, NetError& error) const {
    OV_ASSERT_AS(url != nullptr, "url!=NULL");
    const std::string path = pathOf(url, error);
    if (error.code == 0) error = fileError(AtomicFile::write(path, view()));
    return error.code == 0;
}

bool Data::writeToResource(URL* url) const {
    NetError ignored;
    return writeToResource(url, ignored);
}

StringReturner String::stringFromResource(URL* url) {
    const Ref<Data> data = Data::dataFromResource(url);
    Ref<String> str;
    if (data && g_utf8_validate_len(data->view().data(), data->getLength(), nullptr)) {
        str = String::string(std::string(data->view()));
    }
    OV_ASSERT_MESSAGE_AS(str, "str", "Couldn't interpret string data at %@", url);
    return str;
}

}  // namespace Foundation
