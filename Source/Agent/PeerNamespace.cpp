#include "Agent/PeerNamespace.h"

#include "Foundation/Bus.h"

#include <sys/stat.h>

namespace Orvane {

bool PeerNamespace::sharesFiles(const std::string& peer) {
    const std::uint32_t process = Foundation::Bus::user().getProcessID(peer);
    if (process == 0) return false;
    struct stat theirs;
    struct stat ours;
    const std::string path = "/proc/" + std::to_string(process) + "/ns/mnt";
    return stat(path.c_str(), &theirs) == 0 && stat("/proc/self/ns/mnt", &ours) == 0 &&
           theirs.st_dev == ours.st_dev && theirs.st_ino == ours.st_ino;
}

}  // namespace Orvane
