#include "Model/PublicObjects.h"

namespace Orvane {

namespace {

PublicObjects* sCurrent = nullptr;

}  // namespace

PublicObjects* PublicObjects::current() {
    return sCurrent;
}

void PublicObjects::setCurrent(PublicObjects* port) {
    sCurrent = port;
}

}  // namespace Orvane
