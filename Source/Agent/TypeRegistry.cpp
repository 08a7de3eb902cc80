#include "Agent/TypeRegistry.h"

namespace Orvane {

namespace {

/// The MIME database, which is made of the desktop entries of installed packages. A program that
/// runs has nothing to add to it: one that is installed is known, and one that is not is not to be.
class MIMEDatabase : public TypeRegistry {
 public:
    bool registerApplication() override { return true; }
};

TypeRegistry* sCurrent = nullptr;

}  // namespace

TypeRegistry& TypeRegistry::current() {
    static MIMEDatabase sDesktop;
    return sCurrent ? *sCurrent : sDesktop;
}

void TypeRegistry::setCurrent(TypeRegistry* registry) {
    sCurrent = registry;
}

}  // namespace Orvane
