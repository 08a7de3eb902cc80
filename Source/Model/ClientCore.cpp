#include "Model/ClientCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/ClientSession.h"
#include "Model/LaunchManager.h"
#include "Model/PublicObjects.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "SQLite/QueryOf.h"
#include "SQLite/Transaction.h"
#include "Utilities/FileSystem.h"

#include <vector>

namespace Orvane {

using Foundation::Date;
using Foundation::gLog;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::column;
using SQLite::TableOf;

const char ClientCore::kSchema[] =
    "rowID integer not null unique primary key, signature text unique not null, "
    "private integer, dateUsed real";

const SQLite::Table::IndexSpec ClientCore::kSchemaIndexes[] = {
    {"Clients_signature", "signature"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& ClientCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&ClientCore::mSignature>("signature"),
        column<&ClientCore::mPrivate>("private"),
        column<&ClientCore::mDateUsed>("dateUsed"),
        SQLite::toMany<&ClientCore::mSubscriptions>(),
    };
    return sColumns;
}

void ClientCore::openClientSession() {
    ClientSession::open();
}

void ClientCore::removeOldSvcdPlist() {
    const Ref<Foundation::URL> base = Compatibility::FileSystem::getStorageBaseURL();
    const Ref<String> jobs = String::string("ServiceAgents");
    const Ref<String> name = String::string("com.tarnwick.Orvane.Agent.plist");
    const Ref<Foundation::URL> directory = base->byAppending(jobs, true);
    const Ref<Foundation::URL> file = directory->byAppending(name, false);
    LaunchManager::removeJob(file);
}

Returner<ClientCore> ClientCore::existingClientWithSignature(String* signature) {
    static SQLite::QueryOf<ClientCore>* const sQuery =
        TableOf<ClientCore>::instance()->rowsWhere("signature=?").release();
    sQuery->bind(1, signature);
    Ref<ClientCore> client = sQuery->firstRow();
    gLog.log("existingClientWithSignature(\"%@\") = %@", signature, client.get());
    return Returner<ClientCore>(std::move(client));
}

Returner<ClientCore> ClientCore::createClient(String* signature) {
    OV_ASSERT_AS(signature != nullptr, "sig");
    if (!TableOf<ClientCore>::instance()->getDatabase()->isWriteable()) {
        Ref<ClientCore> existing = existingClientWithSignature(signature);
        if (existing.get()) return Returner<ClientCore>(std::move(existing));
        return Returner<ClientCore>::retained(AgentLink::current().createClient(signature));
    }
    Ref<ClientCore> client;
    try {
        const SQLite::Transaction transaction(true);
        client = existingClientWithSignature(signature);
        if (!client.get()) {
            client = Returner<ClientCore>::adopted(new ClientCore);
            client->_makeRows(signature);
        }
    } catch (...) {
        if (client.get()) client->_giveUpNewRows();
        throw;
    }
    return Returner<ClientCore>(std::move(client));
}

void ClientCore::_makeRows(String* signature) {
    mSignature.setValue(signature);
    markInUse();
    addToTable(TableOf<ClientCore>::instance());
    saveChanges();
    const Ref<SubscriptionCore> settings = _createSubscription(nullptr);
    settings->saveChanges();
}

void ClientCore::_giveUpNewRows() {
    const std::vector<Ref<SQLite::Row>> rows = mSubscriptions.getNewRows();
    for (const Ref<SQLite::Row>& row : rows) {
        row->deleteRow();
    }
    giveUpNewRow(this);
}

ClientCore::~ClientCore() {
    // What has an ID is pointed at by that.
    if (getRowID() != 0) return;
    // Who still holds one of the new rows must not find this behind it.
    for (const Ref<SQLite::Row>& row : mSubscriptions.getNewRows()) {
        static_cast<SubscriptionCore&>(*row).mClient.setValue(nullptr);
    }
}

void ClientCore::markInUse() {
    const Date* used = mDateUsed;
    const double age = Date::getTimeAgo(used);
    // One of the future would stay until then.
    const bool isFresh = used && !Foundation::ClockTrust::isFromWrongClock(used);
    if (isFresh && age < (isChangeable() ? kNoteUseSeconds : kReportUseSeconds)) return;
    if (!isChangeable()) {
        AgentLink::current().markClientInUse(this);
        mDateUsed.unload();
        return;
    }
    gLog.log("%@: Bumping dateUsed (was %@)", this, used);
    const bool wasDormant = isDormant();
    const Ref<Date> now = Date::now();
    mDateUsed.setValue(now);
    if (!wasDormant) return;
    Foundation::NotificationCenter::getLocal()->post(
        SubscriptionCore::kRefreshScheduleChangedNotification, nullptr, nullptr);
}

void ClientCore::public_setPrivate(bool value) {
    if (isChangeable()) return mPrivate.setValue(value);
    AgentLink::current().setPrivate(this, value);
    mPrivate.unload();
}

bool ClientCore::isProcessRunning() const {
    if (!mProcessInfo) mProcessInfo.emplace(mSignature.getValue());
    return mProcessInfo->isRunning();
}

bool ClientCore::isDormant() const {
    const Date* used = mDateUsed;
    // That a wrong clock has left a date of the future is no reason to leave the feeds alone.
    return !used || used->getTimeAgo() >= kDormantSeconds;
}

OVObject* ClientCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
