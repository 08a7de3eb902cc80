#include "SQLite/ChangeSet.h"

#include "Foundation/Ref.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace SQLite {

using Foundation::Dictionary;
using Foundation::MutableDictionaryOf;
using Foundation::Number;
using Foundation::PFRefCounted;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

using MutableTableChanges = MutableDictionaryOf<String, Number>;

Returner<MutableTableChanges> describeTable(const std::unordered_map<RowID, int>& rows) {
    std::vector<std::pair<RowID, int>> ordered(rows.begin(), rows.end());
    std::sort(ordered.begin(), ordered.end());
    Ref<MutableTableChanges> made{MutableTableChanges::dictionary()};
    // Three values stand for all rows.
    std::map<int, Ref<Number>> numbers;
    for (const auto& [rowID, action] : ordered) {
        Ref<Number>& number = numbers[action];
        if (!number.get()) number = Number::number(action);
        made->set(std::to_string(rowID), number.get());
    }
    return Returner<MutableTableChanges>(std::move(made));
}

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
    found->second[rowID] = action;
}

Returner<ChangeDict> ChangeSet::dictionary() const {
    using Changes = MutableDictionaryOf<String, TableChangeDict>;
    Ref<Changes> made{Changes::dictionary()};
    for (const auto& [table, rows] : mTables) {
        made->set(table, describeTable(rows));
    }
    return Returner<Changes>(std::move(made));
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
