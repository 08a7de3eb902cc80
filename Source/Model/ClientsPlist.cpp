#include "Model/ClientsPlist.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/PropertyList.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/TableOf.h"
#include "Utilities/FileUtils.h"

#include <string>

namespace Orvane {

using namespace Foundation;
using SQLite::gLogTruth;

namespace {

using DictionaryRef = Ref<MutableDictionary>;

/// A value that XML cannot hold, such as a text with a control character, must not keep all others
/// from being saved.
void setValue(MutableDictionary& target, const char* key, PFRefCounted* value) {
    std::string error;
    if (!value) return;
    if (const Ref<Data> xml = PropertyList::write(value, &error)) {
        target.set(key, value);
    } else {
        gWarn.log("Cannot save \"%s\" of a row: %s", key, error);
    }
}

void setNumber(MutableDictionary& target, const char* key, double value) {
    if (value != 0) target.set(key, Number::number(value));
}

void setFlag(MutableDictionary& target, const char* key, bool value) {
    if (value) target.set(key, Number::number(true));
}

DictionaryRef describe(const ClientCore& client) {
    DictionaryRef result{MutableDictionary::dictionary()};
    setValue(*result, ClientsPlist::kSignature, client.mSignature);
    setFlag(*result, ClientsPlist::kPrivate, client.mPrivate);
    setValue(*result, ClientsPlist::kDateUsed, client.mDateUsed);
    return result;
}

DictionaryRef describe(const FeedCore& feed) {
    DictionaryRef result{MutableDictionary::dictionary()};
    const URL* url = feed.mURL;
    if (url) result->set(ClientsPlist::kURL, url->getString());
    setValue(*result, ClientsPlist::kLogin, feed.mLogin);
    return result;
}

DictionaryRef describe(const SubscriptionCore& subscription) {
    DictionaryRef result{MutableDictionary::dictionary()};
    result->set(ClientsPlist::kClient, Number::number(subscription.mClient.getRowID()));
    const SQLite::RowID feed = subscription.mFeed.getRowID();
    if (feed != 0) result->set(ClientsPlist::kFeed, Number::number(feed));
    setNumber(*result, ClientsPlist::kRefreshInterval, subscription.mRefreshInterval);
    setNumber(*result, ClientsPlist::kExpirationInterval, subscription.mExpirationInterval);
    setFlag(*result, ClientsPlist::kRefreshesInBackground, subscription.mRefreshesInBackground);
    setFlag(*result, ClientsPlist::kDownloadsEnclosures, subscription.mDownloadsEnclosures);
    setNumber(*result, ClientsPlist::kMaxEnclosureSize, subscription.mMaxEnclosureSize);
    setValue(*result, ClientsPlist::kEnclosureTypes, subscription.mEnclosureTypesString);
    return result;
}

/// Adds what `row` is, unless it is there.
template <class T>
void addOnce(MutableDictionary& rows, const T& row) {
    const std::string key = std::to_string(row.getRowID());
    if (rows.contains(key)) return;
    const DictionaryRef description = describe(row);
    rows.set(key, description.get());
}

struct Root {
    DictionaryRef clients{MutableDictionary::dictionary()};
    DictionaryRef feeds{MutableDictionary::dictionary()};
    DictionaryRef subscriptions{MutableDictionary::dictionary()};

    void add(const SubscriptionCore& subscription) {
        const ClientCore* client = subscription.mClient;
        const FeedCore* feed = subscription.mFeed;
        OV_ASSERT_AS(client, "client");
        addOnce(*clients, *client);
        if (feed) addOnce(*feeds, *feed);
        addOnce(*subscriptions, subscription);
    }
};

/// Null, with `error`, if it cannot be read or is something else.
Returner<Dictionary> readDictionary(URL* url, std::string& error) {
    NetError readError;
    const Ref<Data> xml = Data::dataFromResource(url, readError);
    if (!xml) {
        error = readError.description();
        return nullptr;
    }
    const Ref<PFRefCounted> root = PropertyList::read(xml->asBytes(), &error);
    auto* result = dynamic_cast<Dictionary*>(root.get());
    if (root && !result) error = "it holds no dictionary";
    return Returner<Dictionary>::retained(result);
}

/// Moves a file that cannot be read to a free name, so that the next one does not take its place.
bool keepUnreadable(URL* url) {
    std::string problem;
    if (!FileUtils::exists(url)) return true;
    if (const Ref<Dictionary> root = readDictionary(url, problem)) return true;
    const Ref<URL> directory = url->byDeletingLastPathComponent();
    const Ref<String> name = String::string("Clients-unreadable.plist");
    const Ref<URL> wanted = directory->byAppending(name, false);
    const Ref<URL> aside = FileUtils::pathWithUniqueFilenameForPath(wanted);
    NetError error;
    if (!FileUtils::move(url, aside, error)) {
        gWarn.log("Could not keep %@, which cannot be read, as %@ : %@", url, aside, error);
        return false;
    }
    gWarn.log("Could not read %@ (%s): it is now %@", url, problem, aside);
    return true;
}

}  // namespace

Returner<Dictionary> ClientsPlist::describeDatabase() {
    Root root;
    const auto query = SQLite::TableOf<SubscriptionCore>::instance()->allRows();
    for (SQLite::CursorOf<SubscriptionCore> cursor(*query); cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        try {
            const Ref<SubscriptionCore> subscription = cursor.row();
            root.add(*subscription);
        } catch (const AssertionFailure& failure) {
            doWarnAboutException(&failure, "void Orvane::MinistryOfTruth::saveSubscriptions()");
        }
    }
    const DictionaryRef result{MutableDictionary::dictionary()};
    result->set(kClients, root.clients.get());
    result->set(kFeeds, root.feeds.get());
    result->set(kSubscriptions, root.subscriptions.get());
    return Returner<Dictionary>::retained(result.get());
}

Returner<Dictionary> ClientsPlist::read(URL* url) {
    std::string problem;
    Ref<Dictionary> root = readDictionary(url, problem);
    if (!root) {
        gLogTruth.log("%@ : %s", url, problem);
        gWarn.log("Could not read %@", url);
    }
    return Returner<Dictionary>(std::move(root));
}

bool ClientsPlist::write(const Dictionary* root, URL* url) {
    std::string problem;
    const Ref<Data> xml = PropertyList::write(root, &problem);
    if (!xml) {
        gWarn.log("Could not write %@ : %s", url, problem);
        return false;
    }
    if (!keepUnreadable(url)) return false;
    NetError error;
    if (xml->writeToResource(url, error)) return true;
    gWarn.log("Could not write %@ : %@", url, error);
    return false;
}

}  // namespace Orvane
