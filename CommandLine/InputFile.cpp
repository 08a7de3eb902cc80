#include "InputFile.h"

#include <cerrno>
#include <cstdio>
#include <memory>
#include <system_error>

namespace Commands {

namespace {

[[noreturn]] void fail(const std::string& name) {
    throw std::system_error(errno, std::generic_category(), name);
}

std::string readAll(std::FILE* file, const std::string& name) {
    std::string content;
    char piece[65536];
    while (const std::size_t length = std::fread(piece, 1, sizeof piece, file)) {
        content.append(piece, length);
    }
    if (std::ferror(file)) fail(name);
    return content;
}

}  // namespace

std::string InputFile::read(const std::string& name) {
    if (name == "-") return readAll(stdin, "standard input");
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(name.c_str(), "rbe"),
                                                               std::fclose);
    if (!file) fail(name);
    return readAll(file.get(), name);
}

}  // namespace Commands
