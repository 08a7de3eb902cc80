#include "Foundation/UniqueFD.h"

#include <unistd.h>

#include <cerrno>

namespace Foundation {

void UniqueFD::close() {
    if (mFD < 0) return;
    const int before = errno;
    ::close(std::exchange(mFD, -1));
    errno = before;
}

}  // namespace Foundation
