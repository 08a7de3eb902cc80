#include "Bridges/OVAuthorInternal.h"

std::shared_ptr<OVAuthor> OVAuthorInternal::make(Orvane::AuthorCore* core) {
    auto internal = std::make_unique<OVAuthorInternal>();
    OVAuthorInternal& state = *internal;
    std::shared_ptr<OVAuthor> made(new OVAuthor(std::move(internal)));
    state.setCore(core, made.get());
    return made;
}
