#include "Model/OlderDatabase.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

OlderDatabase* sCurrent = nullptr;
constinit MissingPort sMissing{"OlderDatabase"};

}  // namespace

OlderDatabase* OlderDatabase::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void OlderDatabase::setCurrent(OlderDatabase* port) {
    sCurrent = port;
}

}  // namespace Orvane
