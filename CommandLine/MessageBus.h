#pragma once

#include <memory>
#include <optional>
#include <string>

namespace Commands {

/// The user's message bus, to ask it who is there. Nothing is started by asking.
class MessageBus {
 public:
    /// Connects to the bus of the session, to that of the service manager, or to the one that the
    /// library starts where there is neither: the first that answers.
    MessageBus();
    ~MessageBus();
    MessageBus(const MessageBus&) = delete;
    MessageBus& operator=(const MessageBus&) = delete;

    bool isThere() const;
    /// Whether a service runs.
    bool hasOwner(const std::string& name) const;
    /// Whether the bus knows how to start a service.
    bool canStart(const std::string& name) const;
    /// A property of yes or no; none if it cannot be had.
    std::optional<bool> flag(const std::string& service, const std::string& path,
                             const std::string& interface, const std::string& property) const;

 private:
    struct Connection;
    std::unique_ptr<Connection> mConnection;
};

}  // namespace Commands
