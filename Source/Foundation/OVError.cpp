#include <Orvane/OVError.h>
#include <Orvane/OVFormat.h>

std::string OVError::toString() const {
    if (mDescription.empty()) return OVFormat("%s error %d", mDomain, mCode);
    return OVFormat("%s (%s,%d)", mDescription, mDomain, mCode);
}

std::string describeForFormat(const OVError* error) {
    return error->toString();
}
