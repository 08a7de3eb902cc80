#include "Foundation/PreferenceDomain.h"

#include "Foundation/Logger.h"
#include "Foundation/PreferenceLock.h"
#include "Foundation/PreferenceSwitches.h"

#include <cstring>
#include <memory>
#include <utility>

namespace Foundation {

using State = PreferenceFile::State;

PreferenceDomain& PreferenceDomain::named(std::string_view domain) {
    using Domains = std::map<std::string, std::unique_ptr<PreferenceDomain>>;
    static auto* const sDomains = new Domains;
    std::string path = PreferenceFile::pathOfDomain(domain);
    std::unique_ptr<PreferenceDomain>& instance = (*sDomains)[path];
    if (!instance) instance.reset(new PreferenceDomain(std::move(path)));
    return *instance;
}

PFRefCounted* PreferenceDomain::get(std::string_view key) {
    loadIfNeeded();
    return mValues->get(key);
}

void PreferenceDomain::set(const std::string& key, PFRefCounted* value) {
    loadIfNeeded();
    mChanges.erase(key);
    mChanges.emplace(key, value);
    mValues->set(key, value);
    PreferenceSwitches::setValue(mFile.getPath(), key, value);
}

bool PreferenceDomain::synchronize() {
    if (!mChanges.empty()) return writeChanges();
    reload();
    return true;
}

void PreferenceDomain::loadIfNeeded() {
    if (mValues) return;
    mValues = MutableDictionary::dictionary();
    reload();
}

void PreferenceDomain::reload() {
    Content content = mFile.read();
    if (content.state == State::Damaged) reloadUnderLock(content);
    if (content.state == State::Failed) {
        fail("read", content.reason);
    } else {
        adopt(merged(content));
    }
}

void PreferenceDomain::reloadUnderLock(Content& content) {
    const PreferenceLock lock(mFile.getFolder());
    if (lock.getError() != 0) {
        fail("read", content.reason);
        return;
    }
    // Another process may have cleared it away by now.
    content = mFile.read();
    if (content.state == State::Damaged) clearTheWay(content);
}

bool PreferenceDomain::writeChanges() {
    const PreferenceLock lock(mFile.getFolder());
    Content content = mFile.read();
    if (lock.getError() != 0) {
        if (content.state != State::Failed) adopt(merged(content));
        return fail("saved", std::strerror(lock.getError()));
    }
    if (content.state == State::Damaged && !clearTheWay(content)) return false;
    if (content.state == State::Failed) return fail("read", content.reason);

    adopt(merged(content));
    const bool isSame =
        content.values ? mValues->isEqual(content.values.get()) : mValues->isEmpty();
    if (!isSame) {
        const int error = mFile.write(*mValues);
        if (error != 0) return fail("saved", std::strerror(error));
    }
    mChanges.clear();
    mFailureIsReported = false;
    return true;
}

bool PreferenceDomain::clearTheWay(Content& content) {
    std::string newPath;
    if (mFile.setAside(newPath) != 0) return fail("read", content.reason);
    gWarn.log("The preferences in %s can't be read (%s) and are kept as %s", mFile.getPath(),
              content.reason, newPath);
    content = {};
    return true;
}

Ref<MutableDictionary> PreferenceDomain::merged(const Content& content) const {
    Ref<MutableDictionary> values(MutableDictionary::dictionary());
    if (content.values) {
        for (const auto [key, value] : *content.values) {
            values->set(static_cast<String*>(key), value);
        }
    }
    for (const auto& [key, value] : mChanges) {
        values->set(key, value.get());
    }
    return values;
}

void PreferenceDomain::adopt(Ref<MutableDictionary> values) {
    PreferenceSwitches::setAll(mFile.getPath(), *values);
    // Through a returner the old values are released at once: there may be no pool.
    mValues = Returner<MutableDictionary>(std::move(values));
}

bool PreferenceDomain::fail(const char* what, const std::string& reason) {
    if (!std::exchange(mFailureIsReported, true)) {
        gWarn.log("The preferences in %s can't be %s: %s", mFile.getPath(), what, reason);
    }
    return false;
}

}  // namespace Foundation
