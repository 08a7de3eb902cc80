#include "Model/Housekeeping.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

Housekeeping* sCurrent = nullptr;
constinit MissingPort sMissing{"Housekeeping"};

}  // namespace

Housekeeping* Housekeeping::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void Housekeeping::setCurrent(Housekeeping* port) {
    sCurrent = port;
}

}  // namespace Orvane
