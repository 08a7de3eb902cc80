#pragma once

#include "Foundation/PlatformCenter.h"
#include "Foundation/String.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
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
        std::string name;
        bool isOfAnyName;
        void* object;
        std::uint64_t order;
        bool isOver = false;

        bool wants(const void* postedObject) const { return !object || object == postedObject; }
    };
    using RegistrationPointer = std::shared_ptr<Registration>;
    using Registrations = std::vector<RegistrationPointer>;
    /// In the order in which they were made.
    using Ordered = std::map<std::uint64_t, RegistrationPointer>;
    struct TextHash {
        using is_transparent = void;
        std::size_t operator()(std::string_view text) const noexcept {
            return std::hash<std::string_view>()(text);
        }
    };
    template <class Value>
    using ByText = std::unordered_map<std::string, Value, TextHash, std::equal_to<>>;

    void forget(const Registration& registration);
    Registrations findFor(const String* name, const void* object) const;
    template <class Condition>
    void removeIf(void* observer, Condition condition);

    // Every feed that is refreshed observes something, and each refresh posts several times:
    // neither may cost more for what the other feeds do.
    ByText<Ordered> mByName;
    Ordered mOfAnyName;
    std::unordered_map<void*, Registrations> mByObserver;
    std::uint64_t mOrder = 0;
};

}  // namespace Foundation
