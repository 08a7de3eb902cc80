#include "Foundation/PropertyListVariant.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/BusPeer.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Number.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Support/LogCapture.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <systemd/sd-bus.h>

#include <limits>

using namespace Foundation;
using Support::LogCapture;

namespace {

using Entries = MutableDictionaryOf<String, PFRefCounted>;
using Values = MutableArrayOf<PFRefCounted>;

class PropertyListVariantTest : public testing::Test {
 protected:
    ~PropertyListVariantTest() noexcept override = default;

    BusMessage newMessage() { return peer.signal("/test", "test.Test", "Echo"); }
    /// What comes out at the other end of the bus.
    Dictionary* echo(const Dictionary* sent) {
        BusMessage message = newMessage();
        PropertyListVariant::append(message, sent);
        EXPECT_EQ(message.getSignature(), "a{sv}");
        received = peer.echo(message);
        return PropertyListVariant::read(received);
    }
    /// The same for an entry "v" of a foreign type. The message's end closes the containers.
    template <class... Args>
    PFRefCounted* echoForeign(const char* type, Args... arguments) {
        BusMessage message = newMessage();
        message.open('a', "{sv}").open('e', "sv").append("v").open('v', type);
        EXPECT_GE(sd_bus_message_append(message.get(), type, arguments...), 0);
        message.close().close().close();
        received = peer.echo(message);
        const Dictionary* dictionary = PropertyListVariant::read(received);
        return dictionary ? dictionary->get("v") : nullptr;
    }
    void expectNumber(PFRefCounted* value, Number::Kind kind, double expected) {
        const auto* number = dynamic_cast<Number*>(value);
        ASSERT_NE(number, nullptr);
        EXPECT_EQ(number->getKind(), kind);
        EXPECT_EQ(number->getReal(), expected);
    }

    AutoreleasePool pool;
    Support::PrivateBus bus;
    BusPeer peer{bus};
    BusMessage received;
};

}  // namespace

TEST_F(PropertyListVariantTest, CarriesEveryKindOfValue) {
    Ref<Entries> sent = Entries::dictionary();
    sent->set("text", String::string("caf\xc3\xa9 \xf0\x9f\x8d\xb5"));
    sent->set("empty text", String::string(""));
    sent->set("true", Number::number(true));
    sent->set("least", Number::number(std::numeric_limits<std::int64_t>::min()));
    sent->set("real", Number::number(0.1));
    sent->set("data", Data::data("\0\1\xff", 3));
    sent->set("no data", Data::adopt(""));
    sent->set("date", Date::date(123456789.25));
    sent->set("", String::string("a key without a text"));
    Dictionary* got = echo(sent.get());
    EXPECT_TRUE(IsEqual(got, sent.get())) << ToString(got)->utf8();
    expectNumber(got->get("true"), Number::Kind::Bool, 1);
    expectNumber(got->get("least"), Number::Kind::Integer, -9223372036854775808.0);
    expectNumber(got->get("real"), Number::Kind::Real, 0.1);
    EXPECT_EQ(got->getAs<Date>("date")->getAbsoluteTime(), 123456789.25);
}

TEST_F(PropertyListVariantTest, CarriesNestedCollections) {
    Ref<Entries> rows = Entries::dictionary();
    rows->set("1234567890123", Number::number(18));
    Ref<Values> list = Values::array();
    list->add(String::string("a"));
    list->add(Values::array());
    list->add(Entries::dictionary());
    list->add(rows.get());
    Ref<Entries> sent = Entries::dictionary();
    sent->set("Entries", rows.get());
    sent->set("list", list.get());
    sent->set("none", Entries::dictionary());
    Dictionary* got = echo(sent.get());
    EXPECT_TRUE(IsEqual(got, sent.get())) << ToString(got)->utf8();
}

TEST_F(PropertyListVariantTest, TellsNullFromAnEmptyDictionary) {
    EXPECT_EQ(echo(nullptr), nullptr);
    const Ref<Dictionary> empty = DictionaryOf<String, String>::dictionary({});
    Dictionary* got = echo(empty.get());
    ASSERT_NE(got, nullptr);
    EXPECT_TRUE(got->isEmpty());
}

TEST_F(PropertyListVariantTest, LeavesOutWhatCannotTravel) {
    LogCapture log;
    Ref<Values> list = Values::array();
    list->add(static_cast<PFRefCounted*>(nullptr));
    list->add(String::string("kept"));
    Ref<Entries> sent = Entries::dictionary();
    sent->set("url", URL::url(String::string("http://example.com/")));
    sent->set("zero", String::string(std::string("a\0b", 3)));
    sent->set("list", list.get());
    sent->set(std::string_view("k\0", 2), String::string("value"));
    Dictionary* got = echo(sent.get());
    ASSERT_NE(got, nullptr);
    EXPECT_EQ(got->count(), 1u);
    EXPECT_EQ(got->getAs<Array>("list")->count(), 1u);
    EXPECT_EQ(log.count("[WARNING] The value of \""), 3);
    EXPECT_EQ(
        log.count("[WARNING] An element of an array can't be sent to other processes: (null)"), 1);
}

TEST_F(PropertyListVariantTest, LeavesOutWhatIsDeeperThanTheBusTakes) {
    LogCapture log;
    Ref<PFRefCounted> inner = Ref<Entries>(Entries::dictionary());
    for (int i = 0; i < 100; ++i) {
        Ref<Entries> outer = Entries::dictionary();
        outer->set("in", inner.get());
        inner = Ref<PFRefCounted>(outer);
    }
    const Dictionary* got = echo(static_cast<Dictionary*>(inner.get()));
    int depth = 0;
    for (; got; got = got->getAs<Dictionary>("in")) {
        ++depth;
    }
    EXPECT_EQ(depth, PropertyListVariant::kMaximumDepth + 1);
    EXPECT_EQ(log.count("can't be sent"), 1);
}

TEST_F(PropertyListVariantTest, ReadsForeignNumbers) {
    using enum Number::Kind;
    expectNumber(echoForeign("y", 255), Integer, 255);
    expectNumber(echoForeign("n", -32768), Integer, -32768);
    expectNumber(echoForeign("q", 65535), Integer, 65535);
    expectNumber(echoForeign("i", -5), Integer, -5);
    expectNumber(echoForeign("u", 4294967295u), Integer, 4294967295.0);
    expectNumber(echoForeign("t", std::uint64_t{7}), Integer, 7);
    expectNumber(echoForeign("t", std::uint64_t{1} << 63), Real, 9223372036854775808.0);
}

TEST_F(PropertyListVariantTest, ReadsForeignTextsAndCollections) {
    EXPECT_EQ(ToString(echoForeign("o", "/a/path"))->view(), "/a/path");
    EXPECT_EQ(ToString(echoForeign("g", "a{sv}"))->view(), "a{sv}");
    EXPECT_EQ(ToString(echoForeign("as", 2, "a", "b"))->view(), "(a, b)");
    EXPECT_EQ(ToString(echoForeign("au", 2, 3u, 4u))->view(), "(3, 4)");
    EXPECT_EQ(ToString(echoForeign("a{us}", 2, 3u, "a", 4u, "b"))->view(), "{3 = a, 4 = b}");
    EXPECT_EQ(ToString(echoForeign("a{sb}", 1, "a", 1))->view(), "{a = 1}");
    EXPECT_EQ(ToString(echoForeign("(sx)", "a", std::int64_t{2}))->view(), "(a, 2)");
    EXPECT_EQ(ToString(echoForeign("v", "v", "s", "deep"))->view(), "deep");
    EXPECT_EQ(ToString(echoForeign("a(ss)", 1, "a", "b"))->view(), "((a, b))");
}

TEST_F(PropertyListVariantTest, LeavesOutWhatItCannotRead) {
    LogCapture log;
    const int fd = open("/dev/null", O_RDONLY | O_CLOEXEC);
    EXPECT_EQ(echoForeign("h", fd), nullptr);
    const PFRefCounted* array = echoForeign("(hs)", fd, "kept");
    EXPECT_EQ(ToString(array)->view(), "(kept)");
    close(fd);
    EXPECT_EQ(echoForeign("(d)", 0.0), nullptr) << "the start of the count is no date";
    EXPECT_EQ(log.count("[WARNING] Left out a value of the type 'h' that another process sent"), 2);
    EXPECT_EQ(log.count("[WARNING] Left out a value of the type 'r' that another process sent"), 1);
}

TEST_F(PropertyListVariantTest, ReadsNoDictionaryWhereThereIsNone) {
    LogCapture log;
    BusMessage message = newMessage();
    received = peer.echo(message.append("text"));
    EXPECT_EQ(Ref<Dictionary>(PropertyListVariant::read(received)).get(), nullptr);
    EXPECT_EQ(log.count("[WARNING] Another process sent what is no dictionary"), 1);
}
