#include "Agent/AutoSync.h"

namespace Orvane {

namespace {

AutoSync* sCurrent = nullptr;

}  // namespace

AutoSync* AutoSync::current() {
    return sCurrent;
}

void AutoSync::setCurrent(AutoSync* sync) {
    sCurrent = sync;
}

}  // namespace Orvane
