#include "Foundation/Action.h"

#include "Foundation/Guard.h"

namespace Orvane {

void Action::invoke(void* sender) noexcept {
    if (!mReceiver) return;
    Foundation::callGuarded("void Orvane::Action::invoke(void *)", [&] { (*mReceiver)(sender); });
}

}  // namespace Orvane
