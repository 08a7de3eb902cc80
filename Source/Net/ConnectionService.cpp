#include "Net/ConnectionService.h"

#include "Net/CurlTransport.h"

#include <utility>

namespace Orvane {

namespace {

ConnectionService* sShared = nullptr;

}  // namespace

ConnectionService& ConnectionService::shared() {
    if (sShared) return *sShared;
    static auto* const sService = new ConnectionService(std::make_unique<CurlTransport>());
    return *sService;
}

ConnectionService* ConnectionService::setShared(ConnectionService* service) {
    return std::exchange(sShared, service);
}

ConnectionService::ConnectionService(std::unique_ptr<Transport> transport)
    : mTransport(std::move(transport)) {}

ConnectionService::~ConnectionService() = default;

}  // namespace Orvane
