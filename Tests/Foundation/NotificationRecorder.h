#pragma once

#include "Foundation/Dictionary.h"
#include "Foundation/Notification.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <functional>
#include <string>
#include <vector>

/// An observer that writes down what it is told: "name", and behind a space the text of a
/// distributed notification's object.
class NotificationRecorder {
 public:
    NotificationRecorder() = default;
    /// Also writes its own name, into a list that several share.
    NotificationRecorder(std::string name, std::vector<std::string>* shared)
        : mName(std::move(name)), mShared(shared) {}

    operator Foundation::NotificationReceiver*() { return &mReceiver; }

    std::vector<std::string> notes;
    std::vector<void*> objects;
    Foundation::Ref<Foundation::Dictionary> lastInfo;
    bool objectsAreStrings = false;
    std::function<void(Foundation::Notification*)> also;

 private:
    void receive(Foundation::Notification* notification) {
        std::string note = notification->name->utf8();
        auto* const text = notification->getObject<Foundation::String>();
        if (objectsAreStrings && text) note += " " + text->utf8();
        notes.push_back(note);
        objects.push_back(notification->object);
        lastInfo = notification->info;
        if (mShared) mShared->push_back(mName);
        if (also) also(notification);
    }

    std::string mName;
    std::vector<std::string>* mShared = nullptr;
    Orvane::MethodReceiver<Foundation::Notification, NotificationRecorder> mReceiver{
        this, &NotificationRecorder::receive};
};
