#include "Bridges/OVContentInternal.h"

std::shared_ptr<OVContent> OVContentInternal::make(Orvane::ContentCore* core) {
    auto internal = std::make_unique<OVContentInternal>();
    OVContentInternal& state = *internal;
    std::shared_ptr<OVContent> made(new OVContent(std::move(internal)));
    state.setCore(core, made.get());
    return made;
}
