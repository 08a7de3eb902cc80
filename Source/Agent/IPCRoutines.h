#pragma once

#include "Foundation/BusMessage.h"

#include <cstdint>
#include <span>
#include <string>

namespace Orvane {

/// The agent's side of a routine: reads the arguments of a request, runs the routine, and writes
/// status and results to the reply. False, with nothing done, if the request is malformed.
using mig_routine_t = bool (*)(Foundation::BusMessage& request, Foundation::BusMessage& reply);
/// By the routine's number; null where there is none.
mig_routine_t OrvaneIPC_server_routine(int number);

using IPCRowIDs = std::span<const std::int64_t>;
using IPCBytes = std::span<const std::uint8_t>;

// What each routine does, inside of `OVMIGRoutineWrapper`. Arguments are as they came, results
// are 0 or empty until they are set. All throw `NetException` with `OVInvalidRowIDError` for a row
// that is not there.

void ipc_impl_fix_database(std::int32_t errorCode);
void ipc_impl_get_socket_path(const std::string& name, std::string& path);
void ipc_impl_start_skerry_sync(std::int32_t& started);
void ipc_impl_client_create(const std::string& signature, std::int64_t& client);
void ipc_impl_client_markInUse(std::int64_t client);
void ipc_impl_client_expireAll(std::int64_t client);
void ipc_impl_subscription_create(std::int64_t client, std::uint8_t publishingProtocol,
                                  IPCBytes url, IPCBytes, IPCBytes, IPCBytes,
                                  std::int64_t& subscription);
void ipc_impl_subscription_set(std::int64_t subscription, std::int64_t refreshInterval,
                               std::int64_t expirationInterval, bool refreshesInBackground,
                               bool downloadsEnclosures, std::uint64_t maxEnclosureSize,
                               IPCBytes enclosureTypes);
void ipc_impl_subscription_delete(std::int64_t subscription);
void ipc_impl_feed_refresh(std::int64_t feed, bool arg, std::int64_t& domain);
void ipc_impl_feed_refreshMultiple(IPCRowIDs feeds, bool arg);
void ipc_impl_feed_recoverOldEntries(std::int64_t feed);
void ipc_impl_entry_setContent(std::int64_t entry, const std::string& column, IPCBytes text,
                               IPCBytes data);
void ipc_impl_entry_setAuthor(std::int64_t entry, std::int64_t author);
void ipc_impl_entries_setflags(IPCRowIDs entries, std::int32_t read, std::int32_t flagged);
void ipc_impl_enclosure_action(std::int64_t enclosure, std::int32_t action, std::int32_t& handled);
void ipc_impl_author_create(IPCBytes name, IPCBytes email, IPCBytes url,
                            const std::string& contactBookUid, std::int64_t& author);
void ipc_impl_author_setContactBookUID(std::int64_t author, const std::string& uid);
void ipc_impl_client_setPrivate(std::int64_t client, bool value);
void ipc_impl_subscription_setRefreshInterval(std::int64_t subscription, std::int64_t seconds);
void ipc_impl_subscription_setExpirationInterval(std::int64_t subscription, std::int64_t seconds);
void ipc_impl_subscription_setRefreshesInBackground(std::int64_t subscription, bool value);
void ipc_impl_subscription_setDownloadsEnclosures(std::int64_t subscription, bool value);
void ipc_impl_subscription_setMaxEnclosureSize(std::int64_t subscription, std::int64_t bytes);
void ipc_impl_feed_setLogin(std::int64_t feed, IPCBytes login);
void ipc_impl_entry_setRead(std::int64_t entry, bool value);
void ipc_impl_entry_setFlagged(std::int64_t entry, bool value);

}  // namespace Orvane
