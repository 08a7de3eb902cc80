#include "Bridges/PublicObjectFactory.h"

#include "Bridges/OVAuthorInternal.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVContentInternal.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/TypeName.h"

namespace Orvane {

namespace {

/// Lets a pool hold a public object.
class PooledObject : public Foundation::PFRefCounted {
 public:
    explicit PooledObject(std::shared_ptr<OVObject> object) : mObject(std::move(object)) {}

 private:
    std::shared_ptr<OVObject> mObject;
};

/// The object of a row that has got one by now, or else what `make` makes.
template <class Make>
OVObject* madeFor(Core* row, Make make) {
    OVInternal::catchUp();
    if (OVObject* present = row->getExistingOVObject()) return present;
    return keepInPool(make());
}

}  // namespace

OVObject* keepInPool(std::shared_ptr<OVObject> object) {
    if (!object) return nullptr;
    OVObject* const plain = object.get();
    Foundation::AutoreleasePool::autorelease(new PooledObject(std::move(object)));
    return plain;
}

std::shared_ptr<OVObject> publicObjectOf(Core* row) {
    OVObject* object = Core::getOVObject(row);
    return object ? object->shared_from_this() : nullptr;
}

OVObject* PublicObjectFactory::make(ClientCore* row) {
    return madeFor(row, [row] { return OVClientInternal::_initWithCore(row); });
}

OVObject* PublicObjectFactory::make(SubscriptionCore* row) {
    return madeFor(row, [row] {
        FeedCore* feed = row->getFeed();
        OV_ASSERT_MESSAGE_AS(feed != nullptr, "feed",
                             "Can't create OVFeed from client-settings SubscriptionCore");
        return OVFeedInternal::_initWithFeedCore(feed, row);
    });
}

OVObject* PublicObjectFactory::make(EntryCore* row) {
    return madeFor(row, [row] { return OVEntryInternal::make(row); });
}

OVObject* PublicObjectFactory::make(ContentCore* row) {
    return madeFor(row, [row] { return OVContentInternal::make(row); });
}

OVObject* PublicObjectFactory::make(AuthorCore* row) {
    return madeFor(row, [row] { return OVAuthorInternal::make(row); });
}

OVObject* PublicObjectFactory::make(EnclosureCore* row) {
    return madeFor(row, [row] { return OVEnclosureInternal::make(row); });
}

const char* PublicObjectFactory::getClassName(const OVObject* object) noexcept {
    return object ? Foundation::getTypeName(typeid(*object)) : nullptr;
}

}  // namespace Orvane
