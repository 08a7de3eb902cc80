#include "Bridges/PublicObjectFactory.h"

#include "Bridges/OVAuthorInternal.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVContentInternal.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/OVObjectMaker.h"
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

/// The object, which the current pool keeps. Null for null.
OVObject* keepInPool(std::shared_ptr<OVObject> object) {
    if (!object) return nullptr;
    OVObject* const plain = object.get();
    Foundation::AutoreleasePool::autorelease(new PooledObject(std::move(object)));
    return plain;
}

/// The object of a row that has got one by now, or else what `make` makes.
template <class Make>
OVObject* madeFor(Core* row, Make make) {
    OVInternal::catchUpWithConnection();
    if (OVObject* present = row->getExistingOVObject()) return present;
    return keepInPool(make());
}

}  // namespace

OVObject* PublicObjectFactory::make(ClientCore* row) {
    return madeFor(row, [row] {
        return OVObjectMaker::make<OVClient, OVClientInternal>(
            [row](OVClientInternal& state, OVObject* object) { state._initWithCore(row, object); });
    });
}

OVObject* PublicObjectFactory::make(SubscriptionCore* row) {
    return madeFor(row, [row] {
        FeedCore* feed = row->getFeed();
        OV_ASSERT_MESSAGE_AS(feed != nullptr, "feed",
                             "Can't create OVFeed from client-settings SubscriptionCore");
        return OVObjectMaker::make<OVFeed, OVFeedInternal>(
            [=](OVFeedInternal& state, OVObject* object) {
                state._initWithFeedCore(feed, row, object);
            });
    });
}

OVObject* PublicObjectFactory::make(EntryCore* row) {
    return madeFor(row, [row] {
        return OVObjectMaker::make<OVEntry, OVEntryInternal>(
            [row](OVEntryInternal& state, OVObject* object) { state._initWithCore(row, object); });
    });
}

OVObject* PublicObjectFactory::make(ContentCore* row) {
    return madeFor(row,
                   [row] { return OVObjectMaker::makeFor<OVContent, OVContentInternal>(row); });
}

OVObject* PublicObjectFactory::make(AuthorCore* row) {
    return madeFor(row, [row] { return OVObjectMaker::makeFor<OVAuthor, OVAuthorInternal>(row); });
}

OVObject* PublicObjectFactory::make(EnclosureCore* row) {
    return madeFor(row,
                   [row] { return OVObjectMaker::makeFor<OVEnclosure, OVEnclosureInternal>(row); });
}

const char* PublicObjectFactory::getClassName(const OVObject* object) noexcept {
    return object ? Foundation::getTypeName(typeid(*object)) : nullptr;
}

}  // namespace Orvane
