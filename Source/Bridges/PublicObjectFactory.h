#pragma once

#include "Model/PublicObjects.h"

namespace Orvane {

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

}  // namespace Orvane
