#include "Agent/ServiceManager.h"

#include "Agent/UserServiceManager.h"

namespace Orvane {

namespace {

ServiceManager* sCurrent = nullptr;

}  // namespace

ServiceManager& ServiceManager::current() {
    static UserServiceManager sSystem;
    return sCurrent ? *sCurrent : sSystem;
}

void ServiceManager::setCurrent(ServiceManager* manager) {
    sCurrent = manager;
}

}  // namespace Orvane
