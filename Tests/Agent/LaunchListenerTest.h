#pragma once

#include "Agent/AgentTest.h"
#include "Agent/LaunchListener.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"
#include "Foundation/RunLoop.h"
#include "Foundation/UniqueFD.h"
#include "Support/TempDir.h"

#include <sys/socket.h>
#include <sys/un.h>

#include <cstring>
#include <initializer_list>

/// A listener that has what the test's manager gives it.
class LaunchListenerTest : public testing::Test {
 protected:
    using Values = Foundation::MutableDictionaryOf<Foundation::String, Foundation::PFRefCounted>;

    ~LaunchListenerTest() noexcept override = default;

    /// A socket that listens, in the test's directory.
    int listen(const char* name) {
        Foundation::UniqueFD made(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
        const sockaddr_un address = addressOf(name);
        EXPECT_EQ(bind(made.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
        EXPECT_EQ(::listen(made.get(), 5), 0);
        mListeners.push_back(std::move(made));
        return mListeners.back().get();
    }
    Foundation::UniqueFD connectTo(const char* name) const {
        Foundation::UniqueFD made(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
        const sockaddr_un address = addressOf(name);
        EXPECT_EQ(connect(made.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address),
                  0);
        return made;
    }
    /// The manager hands over these under a name.
    void give(const char* name, std::initializer_list<int> descriptors) {
        const Foundation::Ref<Foundation::MutableArrayOf<Foundation::Number>> array =
            Foundation::MutableArrayOf<Foundation::Number>::array();
        for (const int descriptor : descriptors) {
            const Foundation::Ref<Foundation::Number> number =
                Foundation::Number::number(descriptor);
            array->add(number);
        }
        const Foundation::Ref<Values> sockets = Values::dictionary();
        set(*sockets, name, array);
        reply("Sockets", sockets);
    }
    void reply(const char* key, Foundation::PFRefCounted* value) {
        if (!services.reply.dictionary) services.reply.dictionary = Values::dictionary();
        services.reply.type = Orvane::ServiceManager::Reply::kDictionary;
        if (key) set(static_cast<Values&>(*services.reply.dictionary), key, value);
    }
    static void set(Values& values, const char* key, Foundation::PFRefCounted* value) {
        const Foundation::Ref<Foundation::String> string = Foundation::String::string(key);
        values.set(string, value);
    }
    void make() { listener = std::make_unique<Orvane::LaunchListener>(services); }
    static void turn() { Foundation::RunLoop::current().turn(); }
    /// What was said while the listener was made.
    std::vector<std::string> sayings() {
        log.clear();
        make();
        return log.lines();
    }

    Foundation::AutoreleasePool pool;
    Support::TempDir directory;
    Support::LogCapture log;
    Support::LoggingOn logging{{&Orvane::gLogIPC}};
    FakeServiceManager services;
    std::unique_ptr<Orvane::LaunchListener> listener;

 private:
    sockaddr_un addressOf(const char* name) const {
        sockaddr_un address = {};
        address.sun_family = AF_UNIX;
        std::strncpy(address.sun_path, (directory / name).c_str(), sizeof address.sun_path - 1);
        return address;
    }
    std::vector<Foundation::UniqueFD> mListeners;
};
