#include "Foundation/Prefs.h"

#include "Foundation/ApplicationIdentity.h"
#include "Foundation/Logger.h"
#include "Foundation/PreferenceDomain.h"

#include <cmath>

namespace Foundation {

namespace {

StringReturner applicationDomain() {
    return String::string(ApplicationIdentity::getIdentifier());
}

}  // namespace

Prefs::Prefs() : Prefs(static_cast<String*>(nullptr)) {}

Prefs::Prefs(const char* domain) : Prefs(Ref<String>(String::string(domain)).get()) {}

Prefs::Prefs(String* domain)
    : mDomain(domain ? StringReturner::retained(domain) : applicationDomain()),
      mSaveTimer(this, &Prefs::synchronize),
      mStore(&PreferenceDomain::named(mDomain->view())) {}

Prefs::~Prefs() {
    if (!std::isfinite(mSaveTimer.getTimeRemaining())) return;
    try {
        synchronize();
    } catch (...) {
        warnAboutCurrentException("Foundation::Prefs::~Prefs()");
    }
}

Prefs& Prefs::applicationPrefs() {
    static auto* const sPrefs = new Prefs;
    return *sPrefs;
}

void Prefs::synchronize() {
    mSaveTimer.stop();
    if (mStore->synchronize()) gLogPrefs.log("Synchronized.");
}

void Prefs::saveSoon() {
    mSaveTimer.start(0.0, false);
}

}  // namespace Foundation
