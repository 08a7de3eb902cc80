#pragma once

#include "Model/PublicObjects.h"

#include <Orvane/OVObject.h>

#include <memory>

namespace Orvane {

class Core;

/// Makes the public objects of rows.
class PublicObjectFactory : public PublicObjects {
 public:
    OVObject* make(ClientCore* row) override;
    /// Throws `AssertionFailure` for a client's settings row.
    OVObject* make(SubscriptionCore* row) override;
    OVObject* make(EntryCore* row) override;
    OVObject* make(ContentCore* row) override;
    OVObject* make(AuthorCore* row) override;
    OVObject* make(EnclosureCore* row) override;
    const char* getClassName(const OVObject* object) noexcept override;
};

/// The object, which the current pool keeps. Null for null.
OVObject* keepInPool(std::shared_ptr<OVObject> object);

/// The public object of a row, made on first use; null for null.
template <class T>
std::shared_ptr<T> publicObject(Core* row);

std::shared_ptr<OVObject> publicObjectOf(Core* row);

template <class T>
std::shared_ptr<T> publicObject(Core* row) {
    return std::static_pointer_cast<T>(publicObjectOf(row));
}

}  // namespace Orvane
