#include "Net/ReadAheadFileReader.h"

#include "Foundation/Data.h"
#include "Foundation/URL.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <string>

namespace Orvane {

using Foundation::Data;
using Foundation::DataReturner;

namespace {

constexpr std::size_t kBlockBytes = 65536;

bool isPlainFile(int fd, std::size_t& size) {
    struct stat status {};
    if (fstat(fd, &status) != 0 || !S_ISREG(status.st_mode)) return false;
    size = static_cast<std::size_t>(status.st_size);
    return true;
}

/// Whether there was something to read. A file can grow and shrink meanwhile.
bool appendBlock(int fd, std::string& bytes, bool& failed) {
    const std::size_t length = bytes.size();
    bytes.resize(length + kBlockBytes);
    const ssize_t count = pread(fd, bytes.data() + length, kBlockBytes, static_cast<off_t>(length));
    failed = count < 0 && errno != EINTR;
    bytes.resize(length + (count > 0 ? static_cast<std::size_t>(count) : 0));
    return count > 0 || (count < 0 && errno == EINTR);
}

}  // namespace

ReadAheadFileReader::ReadAheadFileReader(Foundation::URL* url, bool readsAhead) {
    const std::string path = url ? url->getFileSystemRepresentation() : std::string();
    if (path.empty()) return;
    // A pipe would keep whoever opens it waiting.
    mFile = Foundation::UniqueFD(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    if (mFile && readsAhead) posix_fadvise(mFile.get(), 0, 0, POSIX_FADV_WILLNEED);
}

DataReturner ReadAheadFileReader::finish() {
    std::size_t size = 0;
    if (!mFile || !isPlainFile(mFile.get(), size)) return nullptr;
    std::string bytes;
    bytes.reserve(size + kBlockBytes);
    bool failed = false;
    while (appendBlock(mFile.get(), bytes, failed)) {
    }
    bytes.shrink_to_fit();
    return failed ? nullptr : Data::adopt(std::move(bytes));
}

}  // namespace Orvane
