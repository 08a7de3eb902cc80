#include "Foundation/ThreadUtil.h"

namespace Foundation {

ThreadID ThreadUtil::IDCurrent() {
    // The address of a thread's own variable is unique while the thread lives and needs no call.
    static thread_local char sTag;
    return reinterpret_cast<ThreadID>(&sTag);
}

}  // namespace Foundation
