#include "Agent/Client/IPCClient.h"

#include "Agent/Client/InClientCall.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

#include <string>
#include <string_view>
#include <vector>

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;

namespace {

std::span<const std::uint8_t> bytesOf(std::string_view text) {
    return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

std::string shortText(const Foundation::String* text) {
    return std::string(Foundation::String::view(text));
}

}  // namespace

IPCClient* IPCClient::instance() {
    static auto* const sInstance = new IPCClient;
    return sInstance;
}

void IPCClient::connect() {
    setMaker([]() -> AgentLink* { return instance(); });
}

std::span<const std::uint8_t> IPCClient::miggify(const String* text) {
    return bytesOf(String::view(text));
}

std::span<const std::uint8_t> IPCClient::miggify(const URL* url) {
    return url ? bytesOf(url->text()) : std::span<const std::uint8_t>();
}

void IPCClient::fixDatabase(int code) {
    const InClientCall guard("Calling ipc_fix_database, code=%i", code);
    gOrvaneIPCTimeoutMS = kFixTimeoutMS;
    call(RPC::ipc_fix_database, code);
}

Foundation::StringReturner IPCClient::getSocketPath(const char* name) {
    OV_ASSERT_AS(name != nullptr, "name");
    const InClientCall guard("Calling ipc_get_socket_path, name=%s", name);
    std::string path;
    call(RPC::ipc_get_socket_path, std::string(name), path);
    if (path.empty()) return nullptr;
    return String::string(std::move(path));
}

bool IPCClient::startSkerrySync() {
    const InClientCall guard("Calling ipc_start_skerry_sync");
    std::int32_t started = 0;
    call(RPC::ipc_start_skerry_sync, started);
    return started != 0;
}

ClientCore* IPCClient::createClient(String* signature) {
    const InClientCall guard("Calling ipc_client_create, signature=%@", signature);
    std::int64_t client = 0;
    call(RPC::ipc_client_create, shortText(signature), client);
    return ClientCore::getRow(client);
}

void IPCClient::markClientInUse(ClientCore* client) {
    call(RPC::ipc_client_markInUse, client->getRowID());
}

void IPCClient::expireAllEntries(ClientCore* client) {
    call(RPC::ipc_client_expireAll, client->getRowID());
}

void IPCClient::setPrivate(ClientCore* client, bool value) {
    const InClientCall guard("Calling ipc_client_setPrivate, rowID=%lld", client->getRowID());
    call(RPC::ipc_client_setPrivate, client->getRowID(), value);
}

NetError IPCClient::refresh(FeedCore* feed, bool force) {
    OV_ASSERT_AS(feed && feed->getRowID(), "feed && feed->getRowID()");
    const InClientCall guard("Calling ipc_feed_refresh, rowID=%lld", feed->getRowID());
    NetError error;
    // The reply has room for the domain only, so the code is always 0.
    call(RPC::ipc_feed_refresh, feed->getRowID(), force, error.domain);
    if (error.code == 0) feed->unload();
    return error;
}

void IPCClient::refreshMultiple(const RowID* feeds, unsigned count, bool force) {
    if (count == 0) return;
    OV_ASSERT_AS(feeds != nullptr, "feedIDs");
    const InClientCall guard("Calling ipc_feed_refreshMultiple, count=%u", count);
    const std::vector<std::int64_t> rows(feeds, feeds + count);
    call(RPC::ipc_feed_refreshMultiple, std::span<const std::int64_t>(rows), force);
}

void IPCClient::recoverOldEntries(FeedCore* feed) {
    const InClientCall guard("Calling ipc_feed_recoverOldEntries, rowID=%lld", feed->getRowID());
    call(RPC::ipc_feed_recoverOldEntries, feed->getRowID());
}

void IPCClient::setLogin(FeedCore* feed, String* login) {
    const InClientCall guard("Calling ipc_feed_setLogin, rowID=%lld", feed->getRowID());
    call(RPC::ipc_feed_setLogin, feed->getRowID(), miggify(login));
}

void IPCClient::setRead(EntryCore* entry, bool value) {
    const InClientCall guard("Calling ipc_entry_setRead, rowID=%lld", entry->getRowID());
    call(RPC::ipc_entry_setRead, entry->getRowID(), value);
}

void IPCClient::setFlagged(EntryCore* entry, bool value) {
    const InClientCall guard("Calling ipc_entry_setFlagged, rowID=%lld", entry->getRowID());
    call(RPC::ipc_entry_setFlagged, entry->getRowID(), value);
}

void IPCClient::setFlags(const RowID* entries, unsigned count, int read, int flagged) {
    if (count == 0) return;
    const InClientCall guard("Calling ipc_entries_setflags, count=%u", count);
    const std::vector<std::int64_t> rows(entries, entries + count);
    call(RPC::ipc_entries_setflags, std::span<const std::int64_t>(rows), read, flagged);
}

void IPCClient::setContent(EntryCore* entry, const char* column, ContentCore* content) {
    const InClientCall guard("Calling ipc_entry_setContent, rowID=%lld", entry->getRowID());
    const Ref<String> type = content ? content->mMIMEType.getValue() : nullptr;
    const Ref<Foundation::Data> data = content ? content->getData() : nullptr;
    call(RPC::ipc_entry_setContent, entry->getRowID(), std::string(column), miggify(type.get()),
         bytesOf(data.get() ? data->view() : std::string_view()));
}

void IPCClient::setAuthor(EntryCore* entry, AuthorCore* author) {
    const InClientCall guard("Calling ipc_entry_setAuthor, rowID=%lld", entry->getRowID());
    call(RPC::ipc_entry_setAuthor, entry->getRowID(), author ? author->getRowID() : 0);
}

AuthorCore* IPCClient::createAuthor(String* name, String* email, URL* url, String* contactBookUID) {
    const InClientCall guard("Calling ipc_author_create, name=%@", name);
    std::int64_t author = 0;
    call(RPC::ipc_author_create, miggify(name), miggify(email), miggify(url),
         shortText(contactBookUID), author);
    return author > 0 ? AuthorCore::getRow(author) : nullptr;
}

void IPCClient::setContactBookUID(AuthorCore* author, String* uid) {
    const InClientCall guard("Calling ipc_author_setContactBookUID, rowID=%lld",
                             author->getRowID());
    call(RPC::ipc_author_setContactBookUID, author->getRowID(), shortText(uid));
}

bool IPCClient::enclosureAction(EnclosureCore* enclosure, int action) {
    std::int32_t handled = 0;
    call(RPC::ipc_enclosure_action, enclosure->getRowID(), action, handled);
    return handled != 0;
}

}  // namespace Orvane
