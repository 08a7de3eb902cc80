#include "Net/HostSlots.h"

#include "Foundation/Guard.h"

#include <utility>

namespace Orvane {

HostSlots::Ticket::~Ticket() {
    mSlots.giveBack(*this);
}

std::unique_ptr<HostSlots::Ticket> HostSlots::take(const std::string& host,
                                                   std::function<void()> granted) {
    std::unique_ptr<Ticket> ticket(new Ticket(*this, host, std::move(granted)));
    Host& entry = mHosts[host];
    ticket->mMayRun = entry.running < mLimit;
    if (ticket->mMayRun) {
        ++entry.running;
    } else {
        entry.waiting.push_back(ticket.get());
    }
    return ticket;
}

void HostSlots::giveBack(Ticket& ticket) {
    const auto found = mHosts.find(ticket.mHost);
    Host& host = found->second;
    if (!ticket.mMayRun) {
        std::erase(host.waiting, &ticket);
        return;
    }
    if (host.waiting.empty()) {
        if (--host.running == 0) mHosts.erase(found);
        return;
    }
    Ticket* next = host.waiting.front();
    host.waiting.pop_front();
    next->mMayRun = true;
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] { next->mGranted(); });
}

}  // namespace Orvane
