#include "Model/DocumentParser.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

DocumentParser* sCurrent = nullptr;
constinit MissingPort sMissing{"DocumentParser"};

}  // namespace

DocumentParser* DocumentParser::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void DocumentParser::setCurrent(DocumentParser* port) {
    sCurrent = port;
}

}  // namespace Orvane
