#pragma once

#include "Foundation/BusConnection.h"
#include "Support/PrivateBus.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

/// Another connection to a test's bus, such as another process would have.
class BusPeer {
 public:
    explicit BusPeer(const std::string& address) {
        std::string error;
        mConnection = Foundation::BusConnection::open(address, error);
        EXPECT_TRUE(mConnection) << error;
    }
    explicit BusPeer(const Support::PrivateBus& bus) : BusPeer(bus.getAddress()) {}

    const std::string& name() const { return mConnection->getUniqueName(); }
    Foundation::BusMessage signal(const char* path, const char* interface, const char* member) {
        return mConnection->newSignal(path, interface, member);
    }
    void send(Foundation::BusMessage message) {
        Foundation::BusConnection::Messages ignored;
        EXPECT_TRUE(mConnection->send(message, ignored));
    }
    /// Calls a method of the bus itself.
    template <class... Args>
    Foundation::BusMessage call(const char* member, const Args&... arguments) {
        Foundation::BusMessage message = mConnection->newCall(
            {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", member});
        (message.append(arguments), ...);
        return mConnection->call(message, 10);
    }
    /// Waits until all that was sent has passed the bus.
    void settle() { EXPECT_TRUE(call("GetId").isValid()); }
    void own(const char* busName) {
        std::uint32_t result = 0;
        EXPECT_TRUE(call("RequestName", busName, std::uint32_t{4}).read(result));
        EXPECT_EQ(result, 1u) << "somebody else owns it";
    }
    void disown(const char* busName) { EXPECT_TRUE(call("ReleaseName", busName).isValid()); }
    /// Sends itself a message and gives what comes.
    Foundation::BusMessage echo(Foundation::BusMessage& signal) {
        Foundation::BusConnection::Messages messages;
        signal.setDestination(name());
        EXPECT_TRUE(mConnection->send(signal, messages));
        settle();
        while (mConnection->isOpen()) {
            messages.clear();
            mConnection->pump(1, messages);
            if (messages.empty() || messages[0].getMember() == signal.getMember()) break;
        }
        return messages.empty() ? Foundation::BusMessage() : messages[0];
    }

 private:
    std::unique_ptr<Foundation::BusConnection> mConnection;
};
