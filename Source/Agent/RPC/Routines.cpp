#include "Agent/RPC/Routines.h"

#include <algorithm>

namespace Orvane::RPC {

namespace {

constexpr const Routine* kRoutines[] = {
    &ipc_fix_database,
    &ipc_get_socket_path,
    &ipc_start_skerry_sync,
    &ipc_client_create,
    &ipc_client_markInUse,
    &ipc_client_expireAll,
    &ipc_subscription_create,
    &ipc_subscription_set,
    &ipc_subscription_delete,
    &ipc_feed_refresh,
    &ipc_feed_refreshMultiple,
    &ipc_feed_recoverOldEntries,
    &ipc_entry_setContent,
    &ipc_entry_setAuthor,
    &ipc_entries_setflags,
    &ipc_enclosure_action,
    &ipc_author_create,
    &ipc_author_setContactBookUID,
    &ipc_client_setPrivate,
    &ipc_subscription_setRefreshInterval,
    &ipc_subscription_setExpirationInterval,
    &ipc_subscription_setRefreshesInBackground,
    &ipc_subscription_setDownloadsEnclosures,
    &ipc_subscription_setMaxEnclosureSize,
    &ipc_feed_setLogin,
    &ipc_entry_setRead,
    &ipc_entry_setFlagged,
};

}  // namespace

std::string Routine::getSignature() const {
    std::string signature;
    for (const Parameter& argument : arguments) {
        if (argument.name) signature += argument.form;
    }
    return signature;
}

std::span<const Routine* const> allRoutines() {
    return kRoutines;
}

const Routine* findRoutine(int number) {
    const auto* found =
        std::find_if(std::begin(kRoutines), std::end(kRoutines),
                     [&](const Routine* routine) { return routine->number == number; });
    return found == std::end(kRoutines) ? nullptr : *found;
}

const Routine* findRoutine(std::string_view name) {
    const auto* found = std::find_if(std::begin(kRoutines), std::end(kRoutines),
                                     [&](const Routine* routine) { return routine->name == name; });
    return found == std::end(kRoutines) ? nullptr : *found;
}

}  // namespace Orvane::RPC
