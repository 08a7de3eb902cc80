// What clients ask for feeds.

#include "Agent/IPCRoutines.h"
#include "Agent/IPCValues.h"
#include "Agent/SetColumn.h"
#include "Foundation/Guard.h"
#include "Model/FeedCore.h"

namespace Orvane {

using Foundation::Ref;
using Foundation::String;

void ipc_impl_feed_refresh(std::int64_t feed, bool arg, std::int64_t& domain) {
    FeedCore* row = FeedCore::getRow(feed);
    domain = row->refresh(arg, true) ? 0 : row->getLastError().domain;
}

void ipc_impl_feed_refreshMultiple(IPCRowIDs feeds, bool arg) {
    for (const std::int64_t feed : feeds) {
        Foundation::callGuarded("void ipc_impl_feed_refreshMultiple(IPCRowIDs, bool)",
                                [&] { FeedCore::getRow(feed)->refresh(arg, true); });
    }
}

void ipc_impl_feed_recoverOldEntries(std::int64_t feed) {
    FeedCore::getRow(feed)->recoverOldEntries();
}

void ipc_impl_feed_setLogin(std::int64_t feed, IPCBytes login) {
    const Ref<String> text = getLongString(login);
    setColumn<FeedCore>(feed, FeedCore::Login, [&](FeedCore& row) { row.mLogin.setValue(text); });
}

}  // namespace Orvane
