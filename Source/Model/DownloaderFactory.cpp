#include "Model/DownloaderFactory.h"

#include "Model/MissingPort.h"

namespace Orvane {

namespace {

DownloaderFactory* sCurrent = nullptr;
constinit MissingPort sMissing{"DownloaderFactory"};

}  // namespace

DownloaderFactory* DownloaderFactory::current() {
    if (!sCurrent) sMissing.note();
    return sCurrent;
}

void DownloaderFactory::setCurrent(DownloaderFactory* port) {
    sCurrent = port;
}

}  // namespace Orvane
