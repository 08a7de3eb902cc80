#include "Foundation/MessagePort.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"

#include <glib.h>
#include <unistd.h>

#include <random>

namespace Foundation {

namespace {

std::string anonymousName() {
    std::random_device device;
    std::mt19937 generator(device());
    return OVFormat("Orvane_Anon_%i_%08X", getpid(), static_cast<std::uint32_t>(generator()));
}

unsigned lengthOf(const Data* data) {
    return static_cast<unsigned>(Data::asBytes(data).getLength());
}

void logPlainly(const std::string& text) {
    g_log("Orvane", G_LOG_LEVEL_DEBUG, "%s", text.c_str());
}

}  // namespace

MessagePort::MessagePort(String* name, std::size_t capacity) : mRunLoop(&RunLoop::current()) {
    const std::string portName = name ? name->utf8() : anonymousName();
    mLocalPort = LocalMessagePort::create(portName, capacity, _callback, this);
    const bool notCreated = !mLocalPort;
    OV_ASSERT_MESSAGE_AS(!notCreated, "!notCreated",
                         "Failed to create new PFMessagePort named '%s'", portName);
    mLocalPort->addTo(*mRunLoop, RunLoop::kCommonModes);
    mRemotePort = RemoteMessagePort::create(portName, getpid());
    OV_ASSERT_AS(mRemotePort, "mRemotePort");
    gLogMsg.log("Created MessagePort \"%s\" on RunLoop %p", portName, mRunLoop);
}

MessagePort::~MessagePort() {
    invalidate();
}

void MessagePort::invalidate() {
    mLocalPort->invalidate();
}

int MessagePort::sendFromAnyThread(MessageID id, const Data* data) {
    logPlainly(OVFormat(
        "[Msg] Orvane: Sending (id=%i, data=%u bytes) to MessagePort \"%s\" from RunLoop %p", id,
        lengthOf(data), mLocalPort->getName(), &RunLoop::current()));
    const int error = mRemotePort->send(id, Data::asBytes(data).view());
    if (error != 0) {
        logPlainly(OVFormat("[Msg] Orvane: Error %i from PFMessagePortSendRequest", error));
    }
    return error;
}

Data* MessagePort::_callback(LocalMessagePort* port, MessageID id, Data* data, void* info) {
    AutoreleasePool pool;
    try {
        auto* const self = static_cast<MessagePort*>(info);
        gLogMsg.log("MessagePort \"%s\" received(id=%i, data=%u bytes) on RunLoop %p",
                    port->getName(), id, lengthOf(data), self->mRunLoop);
        return self->receive(id, data).detach();
    } catch (...) {
        warnAboutCurrentException(
            "static Data *Foundation::MessagePort::_callback(LocalMessagePort *, MessageID, Data "
            "*, void *)");
        return nullptr;
    }
}

}  // namespace Foundation
