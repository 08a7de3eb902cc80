#include "Bridges/OVEnclosureInternal.h"

std::shared_ptr<OVEnclosure> OVEnclosureInternal::make(Orvane::EnclosureCore* core) {
    auto internal = std::make_unique<OVEnclosureInternal>();
    OVEnclosureInternal& state = *internal;
    std::shared_ptr<OVEnclosure> made(new OVEnclosure(std::move(internal)));
    state.setCore(core, made.get());
    return made;
}
