#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"

namespace Orvane {

/// A user's name and password, and for how long they are to be kept.
class Credential : public Foundation::PFRefCounted {
 public:
    static constexpr int kForSession = 2;
    static constexpr int kPersistentBit = 1;

    /// `user` and `password` may be null, which are empty ones.
    static Foundation::Returner<Credential> credential(Foundation::String* user,
                                                       Foundation::String* password,
                                                       int persistence) {
        return Foundation::Returner<Credential>(new Credential(user, password, persistence));
    }

    Foundation::String* getUser() const { return mUser; }
    Foundation::String* getPassword() const { return mPassword; }
    int getPersistence() const { return mPersistence; }
    /// Whether it is to be kept in the store of credentials once it has been accepted.
    bool isPersistent() const { return (mPersistence & kPersistentBit) != 0; }

 private:
    Credential(Foundation::String* user, Foundation::String* password, int persistence)
        : mUser(user), mPassword(password), mPersistence(persistence) {}

    Foundation::Ref<Foundation::String> mUser;
    Foundation::Ref<Foundation::String> mPassword;
    int mPersistence;
};

}  // namespace Orvane
