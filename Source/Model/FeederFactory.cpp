#include "Model/FeederFactory.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

FeederFactory* sCurrent = nullptr;
constinit MissingPort sMissing{"FeederFactory"};

}  // namespace

FeederFactory* FeederFactory::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void FeederFactory::setCurrent(FeederFactory* port) {
    sCurrent = port;
}

}  // namespace Orvane
