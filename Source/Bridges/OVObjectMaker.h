#pragma once

#include "Model/Core.h"

#include <Orvane/OVObject.h>

#include <memory>
#include <utility>

/// Makes public objects, whose constructors are not for applications.
class OVObjectMaker {
 public:
    /// A new object whose state `init(state, object)` sets up.
    template <class Object, class Internal, class Init>
    static std::shared_ptr<Object> make(Init init) {
        auto internal = std::make_unique<Internal>();
        Internal& state = *internal;
        std::shared_ptr<Object> made(new Object(std::move(internal)));
        init(state, made.get());
        return made;
    }
    /// A new object that stands for a row that has none.
    template <class Object, class Internal>
    static std::shared_ptr<Object> makeFor(Orvane::Core* row) {
        return make<Object, Internal>(
            [row](Internal& state, OVObject* object) { state.setCore(row, object); });
    }
};
