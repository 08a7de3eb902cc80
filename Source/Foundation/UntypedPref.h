#pragma once

#include "Foundation/DictionaryOf.h"
#include "Foundation/Prefs.h"
#include "Foundation/String.h"

#include <concepts>

namespace Foundation {

/// One key of a `Prefs`, to be read as the type that the reader wants and to be assigned to. A
/// value of the wrong type reads as an absent one. Main thread.
class UntypedPref {
 public:
    /// `prefs` must outlive this. A null key has no value and takes none.
    UntypedPref(Prefs& prefs, String* key) : mPrefs(&prefs), mKey(key) {}
    UntypedPref(Prefs& prefs, const char* key) : mPrefs(&prefs), mKey(String::string(key)) {}
    UntypedPref(const UntypedPref&) = default;
    // Would it rename this or change a preference? Say `UntypedPref(...)`, or convert the value.
    UntypedPref& operator=(const UntypedPref&) = delete;

    /// Whether the key has a value.
    bool exists() const;
    /// A number that is not 0, or the text "true", "yes" or "1" in any case of letters.
    operator bool() const;
    /// A number, or the one that a text begins with, cut to the range of `int`; otherwise 0.
    operator int() const;
    /// A number, or the one that a text begins with; otherwise 0.0.
    operator double() const;
    /// A text, or that of a number; empty if there is no value, null for one of another type.
    operator StringReturner() const;
    /// A dictionary; null for all else.
    operator Returner<Dictionary>() const;

    /// Gives the key another value, which is saved at the end of the turn. Anything that a property
    /// list can hold; null removes the key. Values are copied, dates to whole seconds. Throws
    /// `AssertionFailure` for what no property list can hold, and without a key.
    UntypedPref& operator=(std::same_as<bool> auto value) {
        setBool(value);
        return *this;
    }
    UntypedPref& operator=(PFRefCounted* value) {
        set(value);
        return *this;
    }

 private:
    PFRefCounted* value() const;
    void setBool(bool value);
    void set(PFRefCounted* value);

    Prefs* mPrefs;
    Ref<String> mKey;
};

}  // namespace Foundation
