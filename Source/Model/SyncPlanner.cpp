#include "Model/SyncPlanner.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

SyncPlanner* sCurrent = nullptr;
constinit MissingPort sMissing{"SyncPlanner"};

}  // namespace

SyncPlanner* SyncPlanner::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void SyncPlanner::setCurrent(SyncPlanner* port) {
    sCurrent = port;
}

}  // namespace Orvane
