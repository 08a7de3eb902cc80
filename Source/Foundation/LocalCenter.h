#pragma once

#include "Foundation/PlatformCenter.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <memory>
#include <vector>

namespace Foundation {

/// Notifications inside the process. A post calls the callbacks before it returns, in the order in
/// which they were registered, one that was registered twice twice.
///
/// Names are compared as texts. Objects are compared by address alone: the centre does not know
/// what they are. Where strings are objects, equal ones must therefore be one and the same, as
/// `DistributedNotificationCenter::getCanonicalString` makes them.
///
/// Callbacks may post, register and remove. A registration that is removed during a post is not
/// called any more; one that is made during a post is not called by it.
class LocalCenter : public PlatformCenter {
 public:
    void addObserver(void* observer, Callback callback, String* name, void* object) override;
    void removeObserver(void* observer, String* name, void* object) override;
    void removeEveryObserver(void* observer) override;
    void post(String* name, void* object, Dictionary* info, bool isUrgent) override;

 private:
    struct Registration {
        void* observer;
        Callback callback;
        Ref<String> name;
        void* object;
        bool isOver = false;

        bool wants(const String* postedName, const void* postedObject) const;
    };
    using Registrations = std::vector<std::shared_ptr<Registration>>;

    template <class Condition>
    void removeIf(Condition condition);

    Registrations mRegistrations;
};

}  // namespace Foundation
