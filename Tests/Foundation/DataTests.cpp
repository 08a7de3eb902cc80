#include "Foundation/Data.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/MutableData.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;

TEST(Data, CopiesUnlessToldNotTo) {
    char block[] = "abc";
    const Ref<Data> copy = Data::data(block, 3);
    const Ref<Data> view = Data::data(block, 3, false);
    block[0] = 'X';
    EXPECT_EQ(copy->view(), "abc");
    EXPECT_EQ(view->view(), "Xbc");
    EXPECT_EQ(view->getBytes(), block);
    EXPECT_EQ(Ref<Data>(Data::data(Bytes(std::string_view("xy"))))->view(), "xy");
}

TEST(Data, TakesAStringsBytesOver) {
    const std::string_view text("bytes that are too many for a string to hold inside itself");
    std::string bytes(text);
    const void* place = bytes.data();
    const Ref<Data> data = Data::adopt(std::move(bytes));
    EXPECT_EQ(data->getBytes(), place);
    EXPECT_EQ(data->view(), text);
}

TEST(Data, MayBeEmpty) {
    const Ref<Data> data = Data::data(nullptr, 0);
    EXPECT_EQ(data->getLength(), 0u);
    EXPECT_TRUE(data->asBytes().isEmpty());
    EXPECT_TRUE(Data::asBytes(nullptr).isEmpty());
    EXPECT_EQ(OVFormat("%@", data), "<>");
}

TEST(Data, RefusesBytesAtNoPlace) {
    const Support::LogCapture log;
    try {
        const Ref<Data> data = Data::data(nullptr, 1);
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "bytes");
    }
}

TEST(Data, EqualsByBytes) {
    const Ref<Data> a = Data::data("a\0b", 3);
    const Ref<Data> b = Data::mutableData(Bytes(std::string_view("a\0b", 3)));
    const Ref<Data> c = Data::data("a\0c", 3);
    EXPECT_TRUE(a->isEqual(b));
    EXPECT_EQ(a->getHash(), b->getHash());
    EXPECT_FALSE(a->isEqual(c));
    EXPECT_FALSE(a->isEqual(nullptr));
    EXPECT_FALSE(a->isEqual(Ref<String>(String::string("a")).get()));
}

TEST(Data, DescribesItselfInHexadecimal) {
    EXPECT_EQ(OVFormat("%@", Ref<Data>(Data::data("\x00\x7f\xff", 3))), "<007fff>");
    EXPECT_EQ(OVFormat("%@", Ref<Data>(Data::adopt(std::string(32, '\1')))),
              "<0101010101010101010101010101010101010101010101010101010101010101>");
    EXPECT_EQ(OVFormat("%@", Ref<Data>(Data::adopt(std::string(33, '\1')))),
              "<0101010101010101010101010101010101010101010101010101010101010101…> (33 bytes)");
}

TEST(MutableData, Grows) {
    const Ref<MutableData> data = Data::mutableData(100);
    EXPECT_EQ(data->getLength(), 0u);
    data->append(Bytes(std::string_view("ab")));
    const Ref<Data> more = Data::data("cd", 2);
    data->append(more);
    data->append(static_cast<Data*>(nullptr));
    EXPECT_EQ(data->view(), "abcd");
    EXPECT_EQ(data->asBytes().view(), "abcd");
}

TEST(MutableData, AppendsItself) {
    const Ref<MutableData> data = Data::mutableData(Bytes(std::string_view("0123456789abcdef")));
    data->append(data);
    data->append(data);
    EXPECT_EQ(data->getLength(), 64u);
    EXPECT_EQ(data->view().substr(48), "0123456789abcdef");
}

TEST(MutableData, CutsAndFillsUp) {
    const Ref<MutableData> data = Data::mutableData(Bytes(std::string_view("abc")));
    data->setLength(1);
    data->setLength(3);
    EXPECT_EQ(data->view(), std::string_view("a\0\0", 3));
    static_cast<char*>(data->getMutableBytes())[1] = 'x';
    EXPECT_EQ(data->view(), std::string_view("ax\0", 3));
}
