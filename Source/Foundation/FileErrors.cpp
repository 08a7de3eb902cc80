#include "Foundation/FileErrors.h"

#include <cerrno>

namespace Foundation {

NetError fileError(int number) {
    switch (number) {
        case 0:
            return NetError::None;
        case ENOENT:
        case ENOTDIR:
            return {NetError::kPFURL, FileURLError::kNotFound};
        case EACCES:
        case EPERM:
        case EROFS:
            return {NetError::kPFURL, FileURLError::kNoAccess};
        default:
            return {NetError::kPOSIX, number};
    }
}

}  // namespace Foundation
