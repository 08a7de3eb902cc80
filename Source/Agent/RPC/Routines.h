#pragma once

#include "Agent/RPC/Routine.h"

#include <span>
#include <string_view>

namespace Orvane::RPC {

// The routines of the agent. This is a contract with programs that were built with other versions
// of the library: numbers, names and types never change, and no number comes to mean another.
//
// They bear the names of the client's stubs.

inline constexpr RoutineOf<Arguments<Int>, Results<>> ipc_fix_database{
    100, "fix_database", {"errorCode"}};
inline constexpr RoutineOf<Arguments<CString20>, Results<CString255>> ipc_get_socket_path{
    101, "get_socket_path", {"name"}, {"path"}};
inline constexpr RoutineOf<Arguments<>, Results<Int>> ipc_start_skerry_sync{
    102, "start_skerry_sync", {}, {"started"}};
inline constexpr RoutineOf<Arguments<CString255>, Results<RowID>> ipc_client_create{
    103, "client_create", {"signature"}, {"client"}};
inline constexpr RoutineOf<Arguments<RowID>, Results<>> ipc_client_markInUse{
    104, "client_markInUse", {"client"}};
inline constexpr RoutineOf<Arguments<RowID>, Results<>> ipc_client_expireAll{
    105, "client_expireAll", {"client"}};
inline constexpr RoutineOf<Arguments<RowID, UInt8, LongString, LongString, LongString, LongString>,
                           Results<RowID>>
    ipc_subscription_create{
        106,
        "subscription_create",
        {"client", "publishingProtocol", "url", "reserved1", "reserved2", "reserved3"},
        {"subscription"}};
inline constexpr RoutineOf<Arguments<RowID, Int64, Int64, Boolean, Boolean, UInt64, LongString>,
                           Results<>>
    ipc_subscription_set{
        107,
        "subscription_set",
        {"subscription", "refreshInterval", "expirationInterval", "refreshesInBackground",
         "downloadsEnclosures", "maxEnclosureSize", "enclosureTypes"}};
inline constexpr RoutineOf<Arguments<RowID>, Results<>> ipc_subscription_delete{
    108, "subscription_delete", {"subscription"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<Int64>> ipc_feed_refresh{
    109, "feed_refresh", {"feed", "arg"}, {"domain"}};
inline constexpr RoutineOf<Arguments<RowIDs, Boolean>, Results<>> ipc_feed_refreshMultiple{
    110, "feed_refreshMultiple", {"feeds", "arg"}};
inline constexpr RoutineOf<Arguments<RowID>, Results<>> ipc_feed_recoverOldEntries{
    113, "feed_recoverOldEntries", {"feed"}};
inline constexpr RoutineOf<Arguments<RowID, CString20, LongString, Bytes>, Results<>>
    ipc_entry_setContent{115, "entry_setContent", {"entry", "column", "text", "data"}};
inline constexpr RoutineOf<Arguments<RowID, RowID>, Results<>> ipc_entry_setAuthor{
    116, "entry_setAuthor", {"entry", "author"}};
inline constexpr RoutineOf<Arguments<RowIDs, Int, Int>, Results<>> ipc_entries_setflags{
    117, "entries_setflags", {"entries", "read", "flagged"}};
inline constexpr RoutineOf<Arguments<RowID, Int>, Results<Int>> ipc_enclosure_action{
    122, "enclosure_action", {"enclosure", "action"}, {"handled"}};
inline constexpr RoutineOf<Arguments<LongString, LongString, LongString, CString255>,
                           Results<RowID>>
    ipc_author_create{123, "author_create", {"name", "email", "url", "contactBookUid"}, {"author"}};
inline constexpr RoutineOf<Arguments<RowID, CString255>, Results<>> ipc_author_setContactBookUID{
    124, "author_setContactBookUID", {"author", "uid"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<>> ipc_client_setPrivate{
    125, "client_setPrivate", {"client", "value"}};
inline constexpr RoutineOf<Arguments<RowID, Int64>, Results<>> ipc_subscription_setRefreshInterval{
    126, "subscription_setRefreshInterval", {"subscription", "seconds"}};
inline constexpr RoutineOf<Arguments<RowID, Int64>, Results<>>
    ipc_subscription_setExpirationInterval{
        127, "subscription_setExpirationInterval", {"subscription", "seconds"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<>>
    ipc_subscription_setRefreshesInBackground{
        128, "subscription_setRefreshesInBackground", {"subscription", "value"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<>>
    ipc_subscription_setDownloadsEnclosures{
        129, "subscription_setDownloadsEnclosures", {"subscription", "value"}};
inline constexpr RoutineOf<Arguments<RowID, Int64>, Results<>> ipc_subscription_setMaxEnclosureSize{
    130, "subscription_setMaxEnclosureSize", {"subscription", "bytes"}};
inline constexpr RoutineOf<Arguments<RowID, LongString>, Results<>> ipc_feed_setLogin{
    137, "feed_setLogin", {"feed", "login"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<>> ipc_entry_setRead{
    145, "entry_setRead", {"entry", "value"}};
inline constexpr RoutineOf<Arguments<RowID, Boolean>, Results<>> ipc_entry_setFlagged{
    146, "entry_setFlagged", {"entry", "value"}};

/// All of them, by number.
std::span<const Routine* const> allRoutines();
/// Null if no routine has that number or name.
const Routine* findRoutine(int number);
const Routine* findRoutine(std::string_view name);

}  // namespace Orvane::RPC
