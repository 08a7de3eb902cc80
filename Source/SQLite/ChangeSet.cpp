#include "SQLite/ChangeSet.h"

#include "Foundation/Ref.h"

#include <algorithm>
#include <utility>

namespace SQLite {

using Foundation::Dictionary;
using Foundation::MutableDictionaryOf;
using Foundation::Number;
using Foundation::PFRefCounted;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

const char* signOf(std::int64_t action) {
    switch (action) {
        case ChangeAction::kDelete:
            return "-";
        case ChangeAction::kInsert:
            return "+";
        case ChangeAction::kUpdate:
            return "";
        default:
            return "?";
    }
}

}  // namespace

void ChangeSet::note(int action, const char* table, RowID rowID) {
    auto found = mTables.find(std::string_view(table));
    if (found == mTables.end()) found = mTables.try_emplace(table).first;
    auto& [list, tidyAt] = found->second;
    if (!list.empty() && list.back().rowID == rowID) {
        list.back().action = action;
        return;
    }
    if (list.size() >= tidyAt) {
        tidy(list);
        tidyAt = std::max(tidyAt, 2 * list.size());
    }
    list.push_back({rowID, action});
}

void ChangeSet::tidy(std::vector<Change>& list) {
    const auto isBefore = [](const Change& a, const Change& b) { return a.rowID < b.rowID; };
    if (!std::is_sorted(list.begin(), list.end(), isBefore)) {
        std::stable_sort(list.begin(), list.end(), isBefore);
    }
    // Backwards, as the last of the changes of a row is the one that counts.
    const auto isSame = [](const Change& a, const Change& b) { return a.rowID == b.rowID; };
    const auto first = std::unique(list.rbegin(), list.rend(), isSame).base();
    list.erase(list.begin(), first);
}

Returner<TableChangeDict> ChangeSet::describe(std::vector<Change> list) {
    using MutableChanges = MutableDictionaryOf<String, Number>;
    tidy(list);
    Ref<MutableChanges> made{MutableChanges::dictionary()};
    for (const auto& [rowID, action] : list) {
        made->set(std::to_string(rowID), Number::number(action));
    }
    return Returner<MutableChanges>(std::move(made));
}

Returner<ChangeDict> ChangeSet::dictionary() const {
    using Tables = MutableDictionaryOf<String, TableChangeDict>;
    Ref<Tables> made{Tables::dictionary()};
    for (const auto& [table, changes] : mTables) {
        made->set(table, describe(changes.list));
    }
    return Returner<Tables>(std::move(made));
}

Foundation::StringReturner describeChanges(const Dictionary* changes) {
    std::string text;
    if (!changes) return String::string(std::move(text));
    for (const auto& [name, value] : *changes) {
        const auto* table = dynamic_cast<const String*>(name);
        const auto* rows = dynamic_cast<const Dictionary*>(value);
        if (!table || !rows) continue;
        text += OVFormat("\n%15s: ", table->utf8());
        for (const auto& [key, action] : *rows) {
            const auto* rowID = dynamic_cast<const String*>(key);
            const auto* number = dynamic_cast<const Number*>(action);
            if (!rowID) continue;
            text += OVFormat(" %s%s", signOf(Number::getInteger(number)), rowID->utf8());
        }
    }
    return String::string(std::move(text));
}

}  // namespace SQLite
