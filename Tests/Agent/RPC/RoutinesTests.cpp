#include "Agent/RPC/Routines.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace Orvane;
using RPC::Fault;

namespace {

/// A row of the contract, with the types of arguments and results by name.
struct Contract {
    int number;
    const char* name;
    const char* arguments;
    const char* results;
};

// Written out, not made from the table: a change of that is to be noticed here.
constexpr Contract kContract[] = {
    {100, "fix_database", "int", ""},
    {101, "get_socket_path", "CString20", "CString255"},
    {102, "start_skerry_sync", "", "int"},
    {103, "client_create", "CString255", "RowID"},
    {104, "client_markInUse", "RowID", ""},
    {105, "client_expireAll", "RowID", ""},
    {106, "subscription_create", "RowID uint8_t LongString LongString LongString LongString",
     "RowID"},
    {107, "subscription_set", "RowID int64 int64 boolean_t boolean_t uint64 LongString", ""},
    {108, "subscription_delete", "RowID", ""},
    {109, "feed_refresh", "RowID boolean_t", "int64"},
    {110, "feed_refreshMultiple", "RowIDs boolean_t", ""},
    {113, "feed_recoverOldEntries", "RowID", ""},
    {115, "entry_setContent", "RowID CString20 LongString bytes", ""},
    {116, "entry_setAuthor", "RowID RowID", ""},
    {117, "entries_setflags", "RowIDs int int", ""},
    {122, "enclosure_action", "RowID int", "int"},
    {123, "author_create", "LongString LongString LongString CString255", "RowID"},
    {124, "author_setContactBookUID", "RowID CString255", ""},
    {125, "client_setPrivate", "RowID boolean_t", ""},
    {126, "subscription_setRefreshInterval", "RowID int64", ""},
    {127, "subscription_setExpirationInterval", "RowID int64", ""},
    {128, "subscription_setRefreshesInBackground", "RowID boolean_t", ""},
    {129, "subscription_setDownloadsEnclosures", "RowID boolean_t", ""},
    {130, "subscription_setMaxEnclosureSize", "RowID int64", ""},
    {137, "feed_setLogin", "RowID LongString", ""},
    {145, "entry_setRead", "RowID boolean_t", ""},
    {146, "entry_setFlagged", "RowID boolean_t", ""},
};

std::string typesOf(const RPC::Routine::Parameters& parameters) {
    std::string types;
    for (const RPC::Parameter& parameter : parameters) {
        if (!parameter.name) continue;
        if (!types.empty()) types += ' ';
        types += parameter.type;
    }
    return types;
}

template <class Type>
Fault check(const typename Type::Value& value) {
    return Type::check(value);
}

}  // namespace

TEST(Routines, AreThoseOfTheContract) {
    const auto routines = RPC::allRoutines();
    ASSERT_EQ(routines.size(), std::size(kContract));
    for (std::size_t i = 0; i < routines.size(); ++i) {
        const Contract& row = kContract[i];
        EXPECT_EQ(routines[i]->number, row.number);
        EXPECT_STREQ(routines[i]->name, row.name);
        EXPECT_EQ(typesOf(routines[i]->arguments), row.arguments) << row.name;
        EXPECT_EQ(typesOf(routines[i]->results), row.results) << row.name;
    }
}

TEST(Routines, AreFoundByNumberAndByName) {
    for (const Contract& row : kContract) {
        ASSERT_NE(RPC::findRoutine(row.number), nullptr);
        EXPECT_STREQ(RPC::findRoutine(row.number)->name, row.name);
        EXPECT_EQ(RPC::findRoutine(row.name), RPC::findRoutine(row.number));
    }
    for (const int number : {-1, 0, 99, 111, 112, 114, 118, 131, 136, 138, 144, 147, 148}) {
        EXPECT_EQ(RPC::findRoutine(number), nullptr) << number;
    }
    EXPECT_EQ(RPC::findRoutine("entry_setread"), nullptr);
    EXPECT_EQ(RPC::findRoutine(""), nullptr);
}

TEST(Routines, TravelInTheFormsOfTheirArguments) {
    EXPECT_EQ(RPC::ipc_subscription_set.getSignature(), "xxxbbtay");
    EXPECT_EQ(RPC::ipc_subscription_create.getSignature(), "xyayayayay");
    EXPECT_EQ(RPC::ipc_entries_setflags.getSignature(), "axii");
    EXPECT_EQ(RPC::ipc_entry_setContent.getSignature(), "xsayay");
    EXPECT_EQ(RPC::ipc_start_skerry_sync.getSignature(), "");
}

TEST(ArgumentTypes, ShortTextsCountTheirFinalZero) {
    EXPECT_EQ(check<RPC::CString20>(std::string(19, 'x')), Fault::None);
    EXPECT_EQ(check<RPC::CString20>(std::string(20, 'x')), Fault::Malformed);
    EXPECT_EQ(check<RPC::CString255>(std::string(255, 'x')), Fault::None);
    EXPECT_EQ(check<RPC::CString255>(std::string(256, 'x')), Fault::Malformed);
}

TEST(ArgumentTypes, AreBoundInWhatAPeerMaySend) {
    const std::vector<std::int64_t> rows(100'001);
    const std::span<const std::int64_t> all(rows);
    EXPECT_EQ(check<RPC::RowIDs>(all), Fault::TooLarge);
    EXPECT_EQ(check<RPC::RowIDs>(all.first(100'000)), Fault::None);
    const std::vector<std::uint8_t> bytes(16 * 1024 * 1024 + 1);
    const std::span<const std::uint8_t> text(bytes);
    EXPECT_EQ(check<RPC::LongString>(text), Fault::TooLarge);
    EXPECT_EQ(check<RPC::LongString>(text.first(16 * 1024 * 1024)), Fault::None);
    EXPECT_EQ(check<RPC::Bytes>(text), Fault::TooLarge);
}
