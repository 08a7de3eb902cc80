#include "Foundation/RunningProcesses.h"

#include "Foundation/DesktopLaunch.h"
#include "Foundation/RunningApplications.h"

#include <dirent.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <memory>
#include <string_view>
#include <utility>

namespace Foundation {

namespace {

using Directory = std::unique_ptr<DIR, int (*)(DIR*)>;

/// Processes end while they are looked at, so a file that cannot be read is an empty one.
std::string contentOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/// The value of a variable in an environment as the kernel gives it: "NAME=value", each with a
/// final zero.
std::string_view valueOf(std::string_view environment, std::string_view name) {
    while (!environment.empty()) {
        const std::size_t end = std::min(environment.find('\0'), environment.size());
        const std::string_view entry = environment.substr(0, end);
        if (entry.starts_with(name) && entry.substr(name.size()).starts_with('=')) {
            return entry.substr(name.size() + 1);
        }
        environment.remove_prefix(std::min(end + 1, environment.size()));
    }
    return {};
}

/// The file name of a process's program; empty for a process that has ended or is the kernel's.
std::string programOf(const std::string& process) {
    constexpr std::string_view kReplaced = " (deleted)";  // as an update of the program leaves it
    char path[PATH_MAX];
    const ssize_t length = readlink((process + "/exe").c_str(), path, sizeof path);
    if (length <= 0) return "";
    std::string_view name(path, static_cast<std::size_t>(length));
    if (name.ends_with(kReplaced)) name.remove_suffix(kReplaced.size());
    name.remove_prefix(name.rfind('/') + 1);
    return std::string(name);
}

std::string shortNameOf(const std::string& process) {
    std::string name = contentOf(process + "/comm");
    if (name.ends_with('\n')) name.pop_back();
    return name;
}

std::string desktopFileOf(const std::string& process, int pid) {
    const std::string environment = contentOf(process + "/environ");
    return DesktopLaunch::identifier(valueOf(environment, DesktopLaunch::kFileVariable),
                                     valueOf(environment, DesktopLaunch::kProcessVariable), pid);
}

bool isOfThisUser(const std::string& process) {
    struct stat info = {};
    return stat(process.c_str(), &info) == 0 && info.st_uid == getuid();
}

void insertLowerCased(std::set<std::string>& names, std::string name) {
    if (!name.empty()) names.insert(RunningApplications::lowerCased(std::move(name)));
}

void addProcess(std::set<std::string>& names, const std::string& process, int pid) {
    if (!isOfThisUser(process)) return;
    std::string program = programOf(process);
    if (program.empty()) return;
    insertLowerCased(names, std::move(program));
    insertLowerCased(names, shortNameOf(process));
    insertLowerCased(names, desktopFileOf(process, pid));
}

}  // namespace

std::set<std::string> RunningProcesses::getApplications(const std::string& proc) {
    std::set<std::string> names;
    const Directory directory(opendir(proc.c_str()), closedir);
    if (!directory) return names;
    while (const dirent* entry = readdir(directory.get())) {
        const int pid = std::atoi(entry->d_name);
        if (pid > 0) addProcess(names, proc + "/" + entry->d_name, pid);
    }
    return names;
}

}  // namespace Foundation
