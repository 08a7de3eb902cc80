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

TEST(Data, ReadsHexadecimalPairs) {
    const auto bytesOf = [](const char* text) {
        const Ref<String> hex = String::string(text);
        const Ref<Data> data = Data::dataFromHex(hex);
        return data ? std::string(data->view()) : std::string("(null)");
    };
    EXPECT_EQ(bytesOf("4142ff"), "AB\xFF");
    EXPECT_EQ(bytesOf("4a4B"), "JK");
    EXPECT_EQ(bytesOf("41424"), "AB");
    EXPECT_EQ(bytesOf("4142x"), "AB");
    EXPECT_EQ(bytesOf(""), "");
    EXPECT_EQ(bytesOf("41x2"), "(null)");
    EXPECT_EQ(Ref<Data>(Data::dataFromHex(nullptr)).get(), nullptr);
}

TEST(Data, GoesToBase64AndBack) {
    const Ref<Data> data = Data::data("\0\xFF!", 3);
    const Ref<String> text = data->base64String();
    EXPECT_EQ(text->view(), "AP8h");
    EXPECT_TRUE(data->isEqual(Ref<Data>(Data::dataFromBase64(text)).get()));
}

TEST(Data, RefusesNullAsBase64) {
    const Support::LogCapture log;
    try {
        const Ref<Data> data = Data::dataFromBase64(nullptr);
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "base64");
    }
}

TEST(Data, HashesAsPublished) {
    const auto hashOf = [](std::string bytes) {
        return Ref<String>(Ref<Data>(Data::adopt(std::move(bytes)))->SHA1HashString())->utf8();
    };
    EXPECT_EQ(hashOf(""), "da39a3ee5e6b4b0d3255bfef95601890afd80709");
    EXPECT_EQ(hashOf("abc"), "a9993e364706816aba3e25717850c26c9cd0d89d");
    EXPECT_EQ(hashOf(std::string(1000000, 'a')), "34aa973cd4c4daa4f61eeb2bdbad27316534016f");
    const Ref<Data> none = Data::data(nullptr, 0, false);
    EXPECT_EQ(Ref<String>(none->SHA1HashString())->view(),
              "da39a3ee5e6b4b0d3255bfef95601890afd80709");
}
