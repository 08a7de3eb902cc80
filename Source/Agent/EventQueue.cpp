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
#include <utility>

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
        // The kernel has forgotten a descriptor that was closed; its number may be another's now.
        if (!enter(*known) && errno != EEXIST) return false;
        known->event = event;
        known->isPaused = false;
        return true;
    }
    auto added = std::make_unique<Watch>(Watch{event, UniqueFD()});
    switch (event.filter) {
        case kRead:
        case kWrite:
            return keep(std::move(added));
        case kSignal:
            return addSignal(std::move(added));
        default:
            errno = EINVAL;
            return false;
    }
}

bool EventQueue::addSignal(std::unique_ptr<Watch> added) {
    UniqueFD counter(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
    const int signal = static_cast<int>(added->event.ident);
    if (!counter || !beginCounting(signal, counter.get())) return false;
    added->counter = std::move(counter);
    if (keep(std::move(added))) return true;
    endCounting(signal);
    return false;
}

bool EventQueue::keep(std::unique_ptr<Watch> added) {
    if (!enter(*added)) return false;
    mWatches.push_back(std::move(added));
    return true;
}

int EventQueue::Watch::getDescriptor() const {
    return counter ? counter.get() : static_cast<int>(event.ident);
}

/// Has the kernel watch. False, with `errno`, if that cannot be; EEXIST if it does already.
bool EventQueue::enter(Watch& watch) {
    epoll_event wanted = {};
    wanted.events = watch.event.filter == kWrite ? EPOLLOUT : EPOLLIN;
    wanted.data.ptr = &watch;
    return epoll_ctl(mQueue.get(), EPOLL_CTL_ADD, watch.getDescriptor(), &wanted) == 0;
}

void EventQueue::pause(const Event& event) {
    Watch* watch = find(event);
    if (!watch || watch->counter || watch->isPaused) return;
    // Taken out altogether: one that only wants no events is told of hang-ups and errors still.
    epoll_ctl(mQueue.get(), EPOLL_CTL_DEL, watch->getDescriptor(), nullptr);
    watch->isPaused = true;
}

void EventQueue::resume() {
    for (const auto& watch : mWatches) {
        // Nothing comes any more from a descriptor that has been closed.
        if (std::exchange(watch->isPaused, false)) enter(*watch);
    }
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
