#include "Bridges/PublicObject.h"

#include "Model/Core.h"

namespace Orvane {

std::shared_ptr<OVObject> publicObjectOf(Core* row) {
    OVObject* object = Core::getOVObject(row);
    return object ? object->shared_from_this() : nullptr;
}

}  // namespace Orvane
