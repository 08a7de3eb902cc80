#include "Bridges/OVInternal.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/NetException.h"
#include "Foundation/RunLoop.h"
#include "Model/ClientSession.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"

#include <Orvane/OVObject.h>

#include <algorithm>
#include <vector>

using namespace Foundation;
using Orvane::Core;
using Orvane::gLogAPIVerbose;
using SQLite::gDatabase;

namespace {

OVInternal* sFirst = nullptr;
/// Of the connection for which all rows are; 0 before the first.
std::uint32_t sGeneration = 0;

}  // namespace

OVInternal::OVInternal() : mNext(sFirst) {
    if (mNext) mNext->mPrevious = this;
    sFirst = this;
}

OVInternal::~OVInternal() {
    (mPrevious ? mPrevious->mNext : sFirst) = mNext;
    if (mNext) mNext->mPrevious = mPrevious;
    callGuarded("OVInternal::~OVInternal()", [this] { setCore(nullptr, mOwner); });
}

void OVInternal::setCore(Core* core, OVObject* owner) {
    if (core == mCore.get()) return;
    gLogAPIVerbose.log("%@ setCore: %p (%@) owner: %p", this, core, core, owner);
    if (core) core->setOVObject(owner);
    if (mCore.get()) mCore->clearOVObject(mOwner);
    mCore = core;
    mOwner = owner;
    mIsLost = false;
}

Core& OVInternal::useCore() const {
    if (mIsLost) throw NetException(NetError::kOrvane, OVInvalidRowIDError);
    OV_ASSERT_AS(mCore.get() != nullptr, "core");
    return *mCore;
}

void OVInternal::catchUp() {
    Orvane::ClientSession::catchUpIfUnturned();
    catchUpWithConnection();
}

void OVInternal::catchUpWithConnection() {
    if (!gDatabase || !gDatabase->isOpen()) return;
    const std::uint32_t generation = gDatabase->getGeneration();
    if (generation == sGeneration) return;
    sGeneration = generation;
    reattachAll();
}

bool OVInternal::isOutdated() const {
    return mCore.get() && mOwner && mCore->getTable() && !mCore->isCached();
}

void OVInternal::reattachAll() {
    const AutoreleasePool pool;
    struct Outdated {
        OVInternal* internal;
        std::shared_ptr<OVObject> owner;  ///< stays for as long as others are looked at
    };
    std::vector<Outdated> all;
    for (OVInternal* each = sFirst; each; each = each->mNext) {
        if (!each->isOutdated()) continue;
        if (std::shared_ptr<OVObject> owner = each->mOwner->weak_from_this().lock()) {
            all.push_back({each, std::move(owner)});
        }
    }
    std::stable_sort(all.begin(), all.end(), [](const Outdated& a, const Outdated& b) {
        return a.internal->getRank() < b.internal->getRank();
    });
    for (const Outdated& each : all) {
        callGuarded("OVInternal::reattachAll()", [&] { each.internal->reattach(); });
    }
}

void OVInternal::reattach() {
    mIsLost = true;
    const Ref<Core> again = findAgain();
    if (again.get()) setCore(again.get(), mOwner);
    foundAgain();
}

std::string describeForFormat(const OVInternal* internal) {
    return OVFormat("OVInternal[%p]", static_cast<const void*>(internal));
}
