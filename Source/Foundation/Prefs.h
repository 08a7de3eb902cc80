#pragma once

#include "Foundation/String.h"
#include "Foundation/Timer.h"
#include "Foundation/Uncopyable.h"

namespace Foundation {

class PreferenceDomain;

/// The preferences of an application: values of property lists by key. `UntypedPref` reads and
/// changes them. A change shows at once in this process, in every `Prefs` of the domain; it reaches
/// the disk at the end of the run loop's turn, with all others of that turn, and other processes
/// when they synchronize next.
///
/// Main thread.
class Prefs : Uncopyable {
 public:
    /// Of the running application.
    Prefs();
    /// Of another one. Null stands for the running application.
    explicit Prefs(String* domain);
    explicit Prefs(const char* domain);
    /// Saves at once what was still to be saved through this object.
    ~Prefs();

    /// The running application's preferences. Made at the first use and never destroyed.
    static Prefs& applicationPrefs();

    /// Writes to the disk what this process has changed in the domain, and takes over what others
    /// have written. Blocks on the disk. What cannot be written, to a full disk or a home that is
    /// read-only, is reported once and stays to be written by the next call.
    void synchronize();

    String* getDomain() const { return mDomain; }

 private:
    friend class UntypedPref;

    PreferenceDomain& domain() const { return *mStore; }
    void saveSoon();

    Ref<String> mDomain;
    Timer<Prefs> mSaveTimer;
    PreferenceDomain* mStore;  ///< shared by all of the domain, never destroyed
};

}  // namespace Foundation
