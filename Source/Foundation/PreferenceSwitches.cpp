#include "Foundation/PreferenceSwitches.h"

#include "Foundation/ApplicationIdentity.h"
#include "Foundation/PreferenceFile.h"
#include "Foundation/PreferenceReading.h"

#include <map>
#include <mutex>
#include <utility>

namespace Foundation {

namespace {

using Switches = std::map<std::string, bool>;

struct State {
    std::mutex mutex;
    std::map<std::string, Switches> byPath;
};

/// Never destroyed: the log is used to the process's end.
State& state() {
    static auto* const sState = new State;
    return *sState;
}

Switches switchesOf(const Dictionary& values) {
    Switches switches;
    for (const auto [key, value] : values) {
        const auto* name = dynamic_cast<const String*>(key);
        if (name && value) switches[name->utf8()] = PreferenceReading::asSwitch(value);
    }
    return switches;
}

Switches switchesInFile(const std::string& path) {
    // The values are this thread's own as long as they live, so no pool need keep others out.
    const PreferenceFile::Content content = PreferenceFile(path).read();
    return content.values ? switchesOf(*content.values) : Switches();
}

}  // namespace

std::optional<bool> PreferenceSwitches::read(const std::string& key) {
    const std::string path = PreferenceFile::pathOfDomain(ApplicationIdentity::getIdentifier());
    State& shared = state();
    const std::lock_guard lock(shared.mutex);
    auto found = shared.byPath.find(path);
    if (found == shared.byPath.end()) {
        found = shared.byPath.emplace(path, switchesInFile(path)).first;
    }
    const auto entry = found->second.find(key);
    return entry == found->second.end() ? std::nullopt : std::optional(entry->second);
}

void PreferenceSwitches::setAll(const std::string& path, const Dictionary& values) {
    Switches switches = switchesOf(values);
    State& shared = state();
    const std::lock_guard lock(shared.mutex);
    shared.byPath[path] = std::move(switches);
}

void PreferenceSwitches::setValue(const std::string& path, const std::string& key,
                                  const PFRefCounted* value) {
    State& shared = state();
    const std::lock_guard lock(shared.mutex);
    Switches& switches = shared.byPath[path];
    if (value) {
        switches[key] = PreferenceReading::asSwitch(value);
    } else {
        switches.erase(key);
    }
}

}  // namespace Foundation
