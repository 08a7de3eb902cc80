#include "Model/CredentialStore.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

CredentialStore* sCurrent = nullptr;
constinit MissingPort sMissing{"CredentialStore"};

}  // namespace

void CredentialStore::findInternetPassword(Foundation::URL*, Foundation::String*,
                                           PasswordHandler found) {
    found(nullptr);
}

CredentialStore* CredentialStore::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void CredentialStore::setCurrent(CredentialStore* port) {
    sCurrent = port;
}

}  // namespace Orvane
