#include "Bridges/EntryQueryStatement.h"

#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicValues.h"
#include "Foundation/AutoreleasePool.h"
#include "Model/EntryCore.h"
#include "SQLite/Cursor.h"

#include <Orvane/OVFeed.h>

namespace Orvane {

using Foundation::Ref;
using Foundation::String;
using SQLite::Query;

namespace {

/// What has not expired for the client. The expiration date of a subscription that has none is 0
/// or null.
constexpr const char* kSource =
    " from Subscriptions as s, Entries as e"
    " where s.client=? and s.feed!=0 and e.feed=s.feed"
    " and (ifnull(s.expirationDate,0)=0 or e.localDateCreated>s.expirationDate)";

/// The right side of "like". Not the parameter alone: binding that would make sqlite3 want to plan
/// the statement anew, and all bindings would be lost.
constexpr const char* kAnywhere = "'%'||?||'%' escape '\\'";

/// The pattern of a text in which nothing is special.
std::string patternFor(const std::string& text) {
    std::string pattern;
    for (const char c : text) {
        if (c == '%' || c == '_' || c == '\\') pattern += '\\';
        pattern += c;
    }
    return pattern;
}

}  // namespace

EntryQueryStatement::EntryQueryStatement(const ClientCore& client, const OVEntryQuery& query)
    : mClient(client), mQuery(query) {
    mBindings.emplace_back([&client](Query& q, int i) { q.bind(i, &client); });
    chooseFeeds();
    chooseNames();
    chooseStates();
    chooseDates();
    chooseTexts();
}

void EntryQueryStatement::add(const std::string& condition, std::vector<Binding> bindings) {
    mConditions += " and " + condition;
    for (Binding& binding : bindings) {
        mBindings.push_back(std::move(binding));
    }
}

void EntryQueryStatement::chooseFeeds() {
    if (mQuery.feeds.empty()) return;
    std::string list = "[";
    for (const std::shared_ptr<OVFeed>& feed : mQuery.feeds) {
        const SubscriptionCore* subscription =
            feed ? feed->_internal()._subscriptionCore() : nullptr;
        if (!subscription) continue;
        if (list.size() > 1) list += ',';
        list += std::to_string(subscription->getRowID());
    }
    list += ']';
    add("s.rowID in (select value from json_each(?))",
        {[list](Query& q, int i) { q.bind(i, list.c_str(), true); }});
}

void EntryQueryStatement::chooseNames() {
    const auto require = [this](const char* condition, const std::string& text) {
        if (text.empty()) return;
        const Ref<String> checked = stringOf(text);
        add(condition, {[text](Query& q, int i) { q.bind(i, text.c_str(), true); }});
    };
    // Behind all that begin with the prefix stands what has the last character there is added.
    require("e.identifier>=?", mQuery.identifierPrefix);
    if (!mQuery.identifierPrefix.empty()) {
        require("e.identifier<?", mQuery.identifierPrefix + "\U0010FFFF");
    }
    require("e.alternateUrl=?", mQuery.alternateURL);
}

void EntryQueryStatement::chooseStates() {
    const auto require = [this](const char* condition, std::optional<bool> state) {
        if (!state) return;
        const int value = *state ? 1 : 0;
        add(condition, {[value](Query& q, int i) { q.bind(i, value); }});
    };
    require("e.read=?", mQuery.read);
    require("e.flagged=?", mQuery.flagged);
    require("exists (select 1 from Enclosures as n where n.entry=e.rowID)=?", mQuery.hasEnclosures);
}

void EntryQueryStatement::chooseDates() {
    const auto require = [this](const char* comparison, const std::optional<OVDate>& date) {
        if (!date) return;
        const double time = date->absoluteTime();
        add(dateColumn() + comparison, {[time](Query& q, int i) { q.bind(i, time); }});
    };
    require(">=?", mQuery.from);
    require("<?", mQuery.before);
}

void EntryQueryStatement::chooseTexts() {
    const auto binding = [](const std::string& text) -> Binding {
        const Ref<String> checked = stringOf(text);
        const std::string pattern = patternFor(text);
        return [pattern](Query& q, int i) { q.bind(i, pattern.c_str(), true); };
    };
    for (const std::string& word : mQuery.words) {
        if (word.empty()) continue;
        add("(e.title like " + std::string(kAnywhere) +
                " or exists (select 1 from Contents as c"
                " where c.rowID in (e.summary,e.content)"
                " and cast(c.data as text) like " +
                kAnywhere + "))",
            {binding(word), binding(word)});
    }
    if (mQuery.author.empty()) return;
    add("exists (select 1 from Authors as a where a.rowID=e.author"
        " and (a.name like " +
            std::string(kAnywhere) + " or a.email like " + kAnywhere + "))",
        {binding(mQuery.author), binding(mQuery.author)});
}

std::string EntryQueryStatement::dateColumn() const {
    if (mQuery.date == OVEntryQuery::Date::Received) return "e.localDateCreated";
    return "coalesce(nullif(e.datePublished,0),nullif(e.dateUpdated,0),e.localDateCreated)";
}

std::string EntryQueryStatement::order() const {
    const std::string direction = mQuery.ascending ? " asc" : " desc";
    std::string first;
    if (mQuery.order == OVEntryQuery::Order::ByTitle) {
        first = "e.title collate nocase" + direction + ",";
    } else if (mQuery.order == OVEntryQuery::Order::ByFeed) {
        first = "(select f.title from Feeds as f where f.rowID=e.feed) collate nocase" + direction +
                ",e.feed" + direction + ",";
    }
    return " order by " + first + dateColumn() + direction + ",e.rowID" + direction;
}

std::string EntryQueryStatement::entriesSQL() const {
    // The choice is made among row IDs alone, which an index has; only what is chosen is read.
    return "select e.* from Entries as e where e.rowID in (select e.rowID" + std::string(kSource) +
           mConditions + order() + " limit ? offset ?)" + order();
}

std::string EntryQueryStatement::countSQL() const {
    return "select count(*)" + std::string(kSource) + mConditions;
}

void EntryQueryStatement::bind(Query& query) const {
    int index = 0;
    for (const Binding& binding : mBindings) {
        binding(query, ++index);
    }
}

void EntryQueryStatement::walk(const std::function<void(EntryCore*)>& take) const {
    SQLite::QueryOf<EntryCore> query(SQLite::TableOf<EntryCore>::instance(),
                                     SQLite::SQLText(entriesSQL()));
    bind(query);
    const int last = static_cast<int>(mBindings.size());
    query.bind(last + 1, mQuery.limit > 0 ? static_cast<long long>(mQuery.limit) : -1LL);
    query.bind(last + 2, static_cast<long long>(mQuery.offset));
    for (SQLite::CursorOf<EntryCore> cursor(query); cursor.hasRow(); cursor.nextRow()) {
        const Foundation::AutoreleasePool pool;
        const Ref<EntryCore> row = cursor.row();
        take(row.get());
    }
}

std::size_t EntryQueryStatement::count() const {
    Query query(SQLite::gDatabase, SQLite::SQLText(countSQL()));
    bind(query);
    return static_cast<std::size_t>(SQLite::Cursor(query).int64Column(0));
}

}  // namespace Orvane
