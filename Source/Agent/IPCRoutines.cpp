#include "Agent/IPCRoutines.h"

#include "Agent/IPCServer.h"
#include "Agent/OVMIGRoutineWrapper.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"

#include <tuple>

namespace Orvane {

using Foundation::BusMessage;
using Foundation::NetError;

namespace {

void requireBounds(RPC::Fault fault, const RPC::Routine& routine) {
    if (fault == RPC::Fault::None) return;
    Foundation::gWarn.log("IPCServer: %s sends more in a call of %s than may be sent",
                          IPCServer::getCaller(), routine.name);
    throw Foundation::NetException(NetError::kOrvane, OVIPCError);
}

template <const auto& kRoutine, auto kImplementation>
bool serve(BusMessage& request, BusMessage& reply) {
    using Routine = std::decay_t<decltype(kRoutine)>;
    typename Routine::ArgumentList::Values arguments;
    typename Routine::ResultList::Values results;
    if (request.getSignature() != kRoutine.getSignature()) return false;
    if (!Routine::ArgumentList::read(request, arguments)) return false;
    const RPC::Fault fault = Routine::ArgumentList::check(arguments);
    if (fault == RPC::Fault::Malformed) return false;
    const std::int32_t status = OVMIGRoutineWrapper([&] {
        requireBounds(fault, kRoutine);
        const auto call = [&](const auto&... argument) {
            std::apply([&](auto&... result) { kImplementation(argument..., result...); }, results);
        };
        std::apply(call, arguments);
    });
    reply.append(status);
    Routine::ResultList::append(reply, results);
    return true;
}

struct ServerRoutine {
    const RPC::Routine* routine;
    mig_routine_t serve;
};

template <const auto& kRoutine,
          typename std::decay_t<decltype(kRoutine)>::Implementation kImplementation>
constexpr ServerRoutine entry() {
    return {&kRoutine, &serve<kRoutine, kImplementation>};
}

constexpr ServerRoutine kRoutines[] = {
    entry<RPC::ipc_fix_database, &ipc_impl_fix_database>(),
    entry<RPC::ipc_get_socket_path, &ipc_impl_get_socket_path>(),
    entry<RPC::ipc_start_skerry_sync, &ipc_impl_start_skerry_sync>(),
    entry<RPC::ipc_client_create, &ipc_impl_client_create>(),
    entry<RPC::ipc_client_markInUse, &ipc_impl_client_markInUse>(),
    entry<RPC::ipc_client_expireAll, &ipc_impl_client_expireAll>(),
    entry<RPC::ipc_subscription_create, &ipc_impl_subscription_create>(),
    entry<RPC::ipc_subscription_set, &ipc_impl_subscription_set>(),
    entry<RPC::ipc_subscription_delete, &ipc_impl_subscription_delete>(),
    entry<RPC::ipc_feed_refresh, &ipc_impl_feed_refresh>(),
    entry<RPC::ipc_feed_refreshMultiple, &ipc_impl_feed_refreshMultiple>(),
    entry<RPC::ipc_feed_recoverOldEntries, &ipc_impl_feed_recoverOldEntries>(),
    entry<RPC::ipc_entry_setContent, &ipc_impl_entry_setContent>(),
    entry<RPC::ipc_entry_setAuthor, &ipc_impl_entry_setAuthor>(),
    entry<RPC::ipc_entries_setflags, &ipc_impl_entries_setflags>(),
    entry<RPC::ipc_enclosure_action, &ipc_impl_enclosure_action>(),
    entry<RPC::ipc_author_create, &ipc_impl_author_create>(),
    entry<RPC::ipc_author_setContactBookUID, &ipc_impl_author_setContactBookUID>(),
    entry<RPC::ipc_client_setPrivate, &ipc_impl_client_setPrivate>(),
    entry<RPC::ipc_subscription_setRefreshInterval, &ipc_impl_subscription_setRefreshInterval>(),
    entry<RPC::ipc_subscription_setExpirationInterval,
          &ipc_impl_subscription_setExpirationInterval>(),
    entry<RPC::ipc_subscription_setRefreshesInBackground,
          &ipc_impl_subscription_setRefreshesInBackground>(),
    entry<RPC::ipc_subscription_setDownloadsEnclosures,
          &ipc_impl_subscription_setDownloadsEnclosures>(),
    entry<RPC::ipc_subscription_setMaxEnclosureSize, &ipc_impl_subscription_setMaxEnclosureSize>(),
    entry<RPC::ipc_feed_setLogin, &ipc_impl_feed_setLogin>(),
    entry<RPC::ipc_entry_setRead, &ipc_impl_entry_setRead>(),
    entry<RPC::ipc_entry_setFlagged, &ipc_impl_entry_setFlagged>(),
};

}  // namespace

mig_routine_t OrvaneIPC_server_routine(int number) {
    for (const ServerRoutine& entry : kRoutines) {
        if (entry.routine->number == number) return entry.serve;
    }
    return nullptr;
}

}  // namespace Orvane
