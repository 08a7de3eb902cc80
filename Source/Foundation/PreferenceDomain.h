#pragma once

#include "Foundation/DictionaryOf.h"
#include "Foundation/PreferenceFile.h"
#include "Foundation/Uncopyable.h"

#include <map>
#include <string>
#include <string_view>

namespace Foundation {

/// The preferences of one domain in this process, which all `Prefs` of the domain share: what the
/// file held when it was last looked at, with this process's own changes on top.
///
/// Several processes may change the same domain. A change is one of a key: `synchronize` puts the
/// keys that were changed here into what the file holds by then, so no process undoes what another
/// one did to other keys, and of two changes of one key the later one written stays.
///
/// Main thread. Needs no pool, and asserts and logs nothing but warnings, as the log itself asks
/// for its switches here.
class PreferenceDomain : Uncopyable {
 public:
    /// The domain's only instance, which is never destroyed.
    static PreferenceDomain& named(std::string_view domain);

    /// The value of a key, or null. Valid until the key changes.
    PFRefCounted* get(std::string_view key);
    /// Changes a key in this process; null removes it. The next `synchronize` writes it.
    /// REQUIRES: `value` is a property list and is not changed any more.
    void set(const std::string& key, PFRefCounted* value);
    /// Writes what was changed, if anything was, and takes over what other processes wrote. A
    /// failure is reported once, until a write succeeds again, and the changes are kept for the
    /// next time. Whether all changes are on the disk.
    bool synchronize();

 private:
    /// What the process has changed and not written; null for a removed key.
    using Changes = std::map<std::string, Ref<PFRefCounted>>;
    using Content = PreferenceFile::Content;

    explicit PreferenceDomain(std::string path) : mFile(std::move(path)) {}

    void loadIfNeeded();
    void reload();
    void reloadUnderLock(Content& content);
    bool writeChanges();
    bool clearTheWay(Content& content);
    Ref<MutableDictionary> merged(const Content& content) const;
    void adopt(Ref<MutableDictionary> values);
    bool fail(const char* what, const std::string& reason);

    PreferenceFile mFile;
    Ref<MutableDictionary> mValues{};  ///< null before the file was first looked at
    Changes mChanges;
    bool mFailureIsReported = false;
};

}  // namespace Foundation
