#include "Model/ParseMark.h"

#include "Foundation/Clock.h"
#include "Foundation/FileErrors.h"
#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"
#include "Foundation/UniqueFD.h"
#include "Utilities/FileSystem.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cmath>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

namespace Orvane {

using Foundation::Clock;
using Foundation::Ref;
using Foundation::UniqueFD;

namespace {

/// After so long nobody knows any more what a mark was about.
constexpr double kForgottenSeconds = 30 * ParseMark::kBlockedSeconds;

struct LeftBehind {
    int count = 0;
    double date = 0;  ///< of the last one
};
using Marks = std::map<std::string, LeftBehind>;

std::set<std::string>& activeNames() {
    static auto* const sNames = new std::set<std::string>;
    return *sNames;
}

std::string pathOfMarks() {
    const Ref<Foundation::URL> truth = Compatibility::FileSystem::getStorageTruthURL();
    return truth->getFileSystemRepresentation() + "/.parsing";
}

Marks readMarks() {
    Marks marks;
    std::ifstream file(pathOfMarks());
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        LeftBehind mark;
        std::string name;
        const bool isMark =
            words >> mark.count >> mark.date && std::getline(words >> std::ws, name);
        if (!isMark || Clock::current().now() - mark.date > kForgottenSeconds) continue;
        marks[name] = mark;
    }
    return marks;
}

int write(const std::string& text) {
    const UniqueFD file(open(pathOfMarks().c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600));
    if (!file) return errno;
    const ssize_t written = pwrite(file.get(), text.data(), text.size(), 0);
    if (written != static_cast<ssize_t>(text.size())) return written < 0 ? errno : ENOSPC;
    return ftruncate(file.get(), written) == 0 ? 0 : errno;
}

void writeMarks(const Marks& marks) {
    std::string text;
    for (const auto& [name, mark] : marks) {
        text += OVFormat("%d %.3f %s\n", mark.count, mark.date, name);
    }
    const int error = write(text);
    // The document is parsed all the same: a full disk must not stop that.
    if (error != 0) Foundation::gLog.log("Unable to mark a document as being parsed: %d", error);
}

}  // namespace

ParseMark::ParseMark(const Foundation::URL* document) {
    std::string name = document ? document->getFileSystemRepresentation() : std::string();
    if (name.empty() || activeNames().contains(name)) return;
    Marks marks = readMarks();
    LeftBehind& mark = marks[name];
    const double now = Clock::current().now();
    mIsBlocked = mark.count >= kMostLeftBehind && std::abs(now - mark.date) < kBlockedSeconds;
    if (mIsBlocked) return;
    ++mark.count;
    mark.date = now;
    writeMarks(marks);
    activeNames().insert(name);
    mName = std::move(name);
}

ParseMark::~ParseMark() {
    if (mName.empty()) return;
    activeNames().erase(mName);
    Marks marks = readMarks();
    marks.erase(mName);
    writeMarks(marks);
}

}  // namespace Orvane
