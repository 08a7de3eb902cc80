#include "Agent/EventQueue.h"

#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <stdexcept>

namespace Orvane {

using Foundation::UniqueFD;

namespace {

/// Where a signal's handler counts, one more than the descriptor; 0 where none is watched. A
/// handler, unlike a signal that is held back for a `signalfd`, leaves the programs that we start
/// as they would be without us, and needs nothing of threads that were there before.
std::array<std::atomic<int>, NSIG> sCounters;
std::array<struct sigaction, NSIG> sPrevious;

void count(int signal) {
    const int error = errno;
    const std::uint64_t one = 1;
    const int counter = sCounters.at(static_cast<std::size_t>(signal)) - 1;
    // It fails at 2^64 - 2 alone.
    [[maybe_unused]] const ssize_t written = write(counter, &one, sizeof one);
    errno = error;
}

bool beginCounting(int signal, int counter) {
    if (signal <= 0 || signal >= NSIG) {
        errno = EINVAL;
        return false;
    }
    const auto index = static_cast<std::size_t>(signal);
    if (sCounters.at(index) != 0) {
        errno = EBUSY;
        return false;
    }
    struct sigaction action = {};
    action.sa_handler = count;
    action.sa_flags = SA_RESTART;
    sigfillset(&action.sa_mask);
    sCounters.at(index) = counter + 1;
    if (sigaction(signal, &action, &sPrevious.at(index)) == 0) return true;
    sCounters.at(index) = 0;
    return false;
}

void endCounting(int signal) {
    const auto index = static_cast<std::size_t>(signal);
    sigaction(signal, &sPrevious.at(index), nullptr);
    sCounters.at(index) = 0;
}

}  // namespace

EventQueue::EventQueue() : mQueue(epoll_create1(EPOLL_CLOEXEC)) {
    if (!mQueue) throw std::runtime_error("Couldn't create kqueue");
}

EventQueue::~EventQueue() {
    for (const auto& watch : mWatches) {
        if (watch->counter) endCounting(static_cast<int>(watch->event.ident));
    }
}

EventQueue::Watch* EventQueue::find(const Event& event) const {
    const auto found = std::find_if(mWatches.begin(), mWatches.end(), [&](const auto& watch) {
        return watch->event.ident == event.ident && watch->event.filter == event.filter;
    });
    return found == mWatches.end() ? nullptr : found->get();
}

bool EventQueue::add(const Event& event) {
    if (Watch* known = find(event)) {
        known->event = event;
        return true;
    }
    auto added = std::make_unique<Watch>(Watch{event, UniqueFD()});
    switch (event.filter) {
        case kRead:
            return watch(std::move(added), static_cast<int>(event.ident), EPOLLIN);
        case kWrite:
            return watch(std::move(added), static_cast<int>(event.ident), EPOLLOUT);
        case kSignal:
            return addSignal(std::move(added));
        default:
            errno = EINVAL;
            return false;
    }
}

bool EventQueue::addSignal(std::unique_ptr<Watch> added) {
    UniqueFD counter(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
    const int descriptor = counter.get();
    const int signal = static_cast<int>(added->event.ident);
    if (!counter || !beginCounting(signal, descriptor)) return false;
    added->counter = std::move(counter);
    if (watch(std::move(added), descriptor, EPOLLIN)) return true;
    endCounting(signal);
    return false;
}

bool EventQueue::watch(std::unique_ptr<Watch> added, int descriptor, std::uint32_t interest) {
    epoll_event wanted = {};
    wanted.events = interest;
    wanted.data.ptr = added.get();
    if (epoll_ctl(mQueue.get(), EPOLL_CTL_ADD, descriptor, &wanted) != 0) return false;
    mWatches.push_back(std::move(added));
    return true;
}

int EventQueue::fetch(Event& event) {
    epoll_event ready = {};
    const int count = epoll_wait(mQueue.get(), &ready, 1, 0);
    if (count <= 0) return count;
    const auto* watch = static_cast<const Watch*>(ready.data.ptr);
    event = watch->event;
    if (!watch->counter) return 1;
    std::uint64_t deliveries = 0;
    if (read(watch->counter.get(), &deliveries, sizeof deliveries) < 0) {
        return errno == EAGAIN ? 0 : -1;
    }
    event.data = static_cast<std::intptr_t>(deliveries);
    return 1;
}

}  // namespace Orvane
