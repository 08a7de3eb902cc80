#include "Agent/IPCServer.h"

#include "Agent/IPCRoutines.h"
#include "Agent/LaunchListener.h"
#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/InterfaceXML.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/Guard.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <utility>

namespace Orvane {

using Foundation::Bus;
using Foundation::BusMessage;
using Foundation::gWarn;
using Foundation::RunLoop;

namespace {

constexpr const char* kErrorPrefix = "org.freedesktop.DBus.Error.";

void refuse(const BusMessage& request, const char* error, const std::string& text) {
    gLogIPC.log("IPCServer: %s: %s", error, text);
    Bus::user().replyError(request, (std::string(kErrorPrefix) + error).c_str(), text);
}

bool isIntrospection(const BusMessage& request) {
    return request.getInterface() == "org.freedesktop.DBus.Introspectable" &&
           request.getMember() == "Introspect";
}

/// A number for who goes by a unique name, ":1.23".
int numberOf(const std::string& uniqueName) {
    return std::atoi(uniqueName.substr(uniqueName.find('.') + 1).c_str());
}

}  // namespace

IPCServer& IPCServer::instance() {
    static auto* const sServer = new IPCServer;
    return *sServer;
}

bool IPCServer::startServer() {
    const int port = LaunchListener::instance()->getMachServerPort(RPC::kServiceName);
    if (port != 0) gLogIPC.log("IPCServer: Got port %i from svcd", port);
    const bool isRegistered = registerName(port == 0);
    // Whoever has the name answers to it.
    if (!isRegistered && Bus::user().isConnected()) return false;
    instance().listen();
    if (isRegistered) gLogIPC.log("MIG server started");
    return isRegistered;
}

bool IPCServer::registerName(bool isLogged) {
    Bus& bus = Bus::user();
    if (bus.requestName(RPC::kServiceName)) {
        if (isLogged) {
            gLogIPC.log("IPCServer: allocated and registered Mach port %i",
                        numberOf(bus.getUniqueName()));
        }
        return true;
    }
    if (bus.isConnected()) {
        gWarn.log("IPCServer: bootstrap_register(): %i %s", EEXIST, std::strerror(EEXIST));
    } else {
        gWarn.log("IPCServer: mach_port_allocate(): %i %s", ENOTCONN, std::strerror(ENOTCONN));
    }
    return false;
}

void IPCServer::listen() {
    if (!getLoop()) addTo(RunLoop::current(), RunLoop::kDefaultMode);
    if (mObject) return;
    Bus& bus = Bus::user();
    mObject = bus.handleCalls(RPC::kObjectPath,
                              [this](BusMessage& request) { mRequests.push_back(request); });
    mNameWatch = bus.watchName(
        RPC::kServiceName,
        [](const std::string&, const std::string&, const std::string& owner) { noteOwner(owner); });
}

void IPCServer::noteOwner(const std::string& owner) {
    if (owner.empty() || owner == Bus::user().getUniqueName()) return;
    // The bus was away, and on the new one somebody was faster. Only one of them may write.
    gWarn.log("IPCServer: %s is the agent now; leaving it the work", owner);
    RunLoop::current().stop();
}

std::string IPCServer::getCaller() {
    return instance().mCaller;
}

IPCServer::Interest IPCServer::interest() noexcept {
    Interest wanted;
    wanted.readyNow = !mRequests.empty();
    return wanted;
}

void IPCServer::ready(short) {
    // All of them, or those who send more than a turn takes would fill the memory.
    while (!mRequests.empty()) {
        BusMessage request = std::move(mRequests.front());
        mRequests.pop_front();
        Foundation::callGuarded("void Orvane::IPCServer::ready(short)", [&] { serve(request); });
    }
}

void IPCServer::serve(BusMessage& request) {
    const std::string interface = request.getInterface();
    if (isIntrospection(request)) {
        BusMessage reply = request.newReply();
        _send(request, reply.append(RPC::describeObject()));
    } else if (!interface.empty() && interface != RPC::kInterface) {
        refuse(request, "UnknownInterface", "There is no such interface");
    } else {
        callRoutine(request);
    }
}

void IPCServer::callRoutine(BusMessage& request) {
    const std::string name = request.getMember();
    const RPC::Routine* routine = RPC::findRoutine(std::string_view(name));
    const mig_routine_t stub = routine ? OrvaneIPC_server_routine(routine->number) : nullptr;
    if (!stub) return refuse(request, "UnknownMethod", "There is no such method");
    mCaller = request.getSender();
    OVReceivedRPC(routine->number, routine->name);
    BusMessage reply = request.newReply();
    const bool isGood = stub(request, reply);
    mCaller.clear();
    if (isGood) {
        _send(request, reply);
    } else {
        refuse(request, "InvalidArgs", "The arguments are not those of " + name);
    }
}

void IPCServer::_send(const BusMessage& request, BusMessage& reply) {
    if (Bus::user().send(reply) || reply.isValid()) return;
    std::fprintf(stderr, "%d: badly generated MIG reply for port %x\n", EINVAL,
                 static_cast<unsigned>(numberOf(request.getSender())));
}

void OVReceivedRPC(int, const char* name) {
    gLogIPC.log("Received Message \"%s\"", name);
    Foundation::NotificationCenter::getLocal()->post(
        IPCServer::kCallHandledNotification, Foundation::String::string(std::string()), nullptr);
}

}  // namespace Orvane
