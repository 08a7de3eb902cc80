#pragma once

#include "Foundation/Dictionary.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/PlatformCenter.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <string>
#include <vector>

/// A distributed centre that keeps what is posted and delivers what the test says, while it lives.
class FakeCenter : public Foundation::PlatformCenter {
 public:
    struct Post {
        std::string name;
        std::string object;
        Foundation::Ref<Foundation::Dictionary> info;
        bool isUrgent;
    };

    FakeCenter() { Foundation::DistributedNotificationCenter::setInstance(&center); }
    ~FakeCenter() override { Foundation::DistributedNotificationCenter::setInstance(nullptr); }

    void addObserver(void*, Callback, Foundation::String* name, void* object) override {
        subscriptions.push_back(name->utf8() + " " + text(object));
    }
    void removeObserver(void*, Foundation::String*, void*) override {}
    void removeEveryObserver(void*) override {}
    void post(Foundation::String* name, void* object, Foundation::Dictionary* info,
              bool isUrgent) override {
        posts.push_back({name->utf8(), text(object), info, isUrgent});
    }
    /// As if another process had posted.
    void deliver(const char* name, const std::string& object, Foundation::Dictionary* info) {
        const Foundation::Ref<Foundation::String> nameString = Foundation::String::string(name);
        const Foundation::Ref<Foundation::String> sender = Foundation::String::string(object);
        const Foundation::Notification note{nameString.get(), sender.get(), info};
        center.deliver(&note);
    }

    std::vector<std::string> subscriptions;
    std::vector<Post> posts;
    Foundation::DistributedNotificationCenter center{this};

 private:
    static std::string text(void* object) {
        return object ? static_cast<Foundation::String*>(object)->utf8() : "";
    }
};
