#include "Foundation/UntypedPref.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/PreferenceDomain.h"
#include "Foundation/PreferenceReading.h"
#include "Foundation/PropertyList.h"

#include <string>

namespace Foundation {

namespace {

/// The value as every process will read it from the file, and a copy that nobody can change. Throws
/// for what a file cannot hold, which would keep all others from being saved.
Ref<PFRefCounted> storedForm(String* key, PFRefCounted* value) {
    const Ref<MutableDictionary> file = MutableDictionary::dictionary({{key, value}});
    std::string wrong;
    const Ref<Data> xml = PropertyList::write(file, &wrong);
    OV_ASSERT_MESSAGE(xml, "preferences can't hold %@ = %@: %s", key, value, wrong);
    const Ref<PFRefCounted> read = PropertyList::read(xml->asBytes());
    return static_cast<Dictionary*>(read.get())->get(key);
}

}  // namespace

PFRefCounted* UntypedPref::value() const {
    return mKey ? mPrefs->domain().get(mKey->view()) : nullptr;
}

bool UntypedPref::exists() const {
    return value() != nullptr;
}

UntypedPref::operator bool() const {
    const bool result = PreferenceReading::asBool(value()).value_or(false);
    gLogPrefs.log("Get %@ => %s", mKey, result ? "true" : "false");
    return result;
}

UntypedPref::operator int() const {
    const int result = PreferenceReading::asInt(value());
    gLogPrefs.log("Get %@ => %i", mKey, result);
    return result;
}

UntypedPref::operator double() const {
    gLogPrefs.log("%@ => %@", mKey, value());
    return PreferenceReading::asDouble(value());
}

UntypedPref::operator StringReturner() const {
    gLogPrefs.log("%@ => %@", mKey, value());
    return PreferenceReading::asString(value());
}

UntypedPref::operator Returner<Dictionary>() const {
    return Returner<Dictionary>::retained(dynamic_cast<Dictionary*>(value()));
}

void UntypedPref::setBool(bool value) {
    const Ref<Number> number(Number::number(value));
    set(number);
}

void UntypedPref::set(PFRefCounted* newValue) {
    OV_ASSERT_AS(mKey, "mKey");
    gLogPrefs.log("Set %@ = %@", mKey, newValue);
    Ref<PFRefCounted> kept;
    if (newValue) kept = Returner<PFRefCounted>(storedForm(mKey, newValue));
    mPrefs->domain().set(mKey->utf8(), kept);
    mPrefs->saveSoon();
}

}  // namespace Foundation
