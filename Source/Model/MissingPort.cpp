#include "Model/MissingPort.h"

#include "Foundation/Logger.h"

namespace Orvane {

void MissingPort::note() {
    if (mNoted) return;
    mNoted = true;
    Foundation::gWarn.log("%s: nothing stands behind it in this process", mName);
}

}  // namespace Orvane
