#include "Foundation/LocalMessagePort.h"

#include "Foundation/Data.h"
#include "Foundation/Ref.h"
#include "Foundation/UniqueFD.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <utility>

namespace Foundation {

class MessagePortBox : Uncopyable {
 public:
    struct Message {
        MessageID id;
        std::string bytes;
    };

    explicit MessagePortBox(std::size_t capacity)
        : mCapacity(capacity), mEvent(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {}

    int getEventFD() const { return mEvent.get(); }
    bool isEmpty() const {
        const std::lock_guard lock(mMutex);
        return mMessages.empty();
    }

    int put(MessageID id, std::string_view bytes) {
        const std::lock_guard lock(mMutex);
        if (!mIsValid) return kMessagePortIsInvalid;
        if (mMessages.size() >= mCapacity) return kMessagePortSendWouldWait;
        mMessages.push_back({id, std::string(bytes)});
        // Fails only when the counter is full, and then a wake-up is pending already.
        const std::uint64_t one = 1;
        [[maybe_unused]] const ssize_t ignored = write(mEvent.get(), &one, sizeof one);
        return 0;
    }

    std::optional<Message> take() {
        const std::lock_guard lock(mMutex);
        std::uint64_t count;
        [[maybe_unused]] const ssize_t ignored = read(mEvent.get(), &count, sizeof count);
        if (mMessages.empty()) return std::nullopt;
        Message first = std::move(mMessages.front());
        mMessages.pop_front();
        return first;
    }

    void invalidate() {
        const std::lock_guard lock(mMutex);
        mIsValid = false;
        mMessages.clear();
    }

 private:
    const std::size_t mCapacity;
    const UniqueFD mEvent;
    mutable std::mutex mMutex;
    std::deque<Message> mMessages;  ///< guarded by mMutex
    bool mIsValid = true;           ///< guarded by mMutex
};

namespace {

/// The ports of the process, by name.
struct Registry {
    std::mutex mutex;
    std::map<std::string, std::shared_ptr<MessagePortBox>> boxes;

    static Registry& instance() {
        static Registry* const sInstance = new Registry;
        return *sInstance;
    }
};

}  // namespace

std::unique_ptr<LocalMessagePort> LocalMessagePort::create(const std::string& name,
                                                           std::size_t capacity, Callback callback,
                                                           void* info) {
    auto box = std::make_shared<MessagePortBox>(capacity);
    Registry& registry = Registry::instance();
    const std::lock_guard lock(registry.mutex);
    if (box->getEventFD() < 0 || !registry.boxes.try_emplace(name, box).second) return nullptr;
    return std::unique_ptr<LocalMessagePort>(
        new LocalMessagePort(name, std::move(box), callback, info));
}

LocalMessagePort::LocalMessagePort(std::string name, std::shared_ptr<MessagePortBox> box,
                                   Callback callback, void* info)
    : mName(std::move(name)), mBox(std::move(box)), mCallback(callback), mInfo(info) {}

LocalMessagePort::~LocalMessagePort() {
    invalidate();
}

void LocalMessagePort::invalidate() {
    removeFromLoop();
    mBox->invalidate();
    Registry& registry = Registry::instance();
    const std::lock_guard lock(registry.mutex);
    const auto found = registry.boxes.find(mName);
    if (found != registry.boxes.end() && found->second == mBox) registry.boxes.erase(found);
}

RunLoopSource::Interest LocalMessagePort::interest() noexcept {
    return {.fd = mBox->getEventFD(), .events = POLLIN, .readyNow = !mBox->isEmpty()};
}

void LocalMessagePort::ready(short) {
    const std::optional<MessagePortBox::Message> message = mBox->take();
    if (!message) return;
    const Ref<Data> data = Data::data(message->bytes.data(), message->bytes.size());
    // The callback may destroy the port, which is not touched from here on.
    const Ref<Data> reply = Returner<Data>(mCallback(this, message->id, data, mInfo));
}

std::unique_ptr<RemoteMessagePort> RemoteMessagePort::create(const std::string& name, pid_t pid) {
    if (pid != getpid()) return nullptr;
    Registry& registry = Registry::instance();
    const std::lock_guard lock(registry.mutex);
    const auto found = registry.boxes.find(name);
    if (found == registry.boxes.end()) return nullptr;
    return std::unique_ptr<RemoteMessagePort>(new RemoteMessagePort(found->second));
}

int RemoteMessagePort::send(MessageID id, std::string_view bytes) {
    return mBox->put(id, bytes);
}

}  // namespace Foundation
