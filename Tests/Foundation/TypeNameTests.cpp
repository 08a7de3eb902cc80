#include "Foundation/TypeName.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/RefCounted.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <map>
#include <string>

using namespace Foundation;

namespace {

const void* at(std::uintptr_t address) {
    return reinterpret_cast<const void*>(address);
}

template <int Depth>
struct Nested {
    using Type = std::map<int, typename Nested<Depth - 1>::Type>;
};
template <>
struct Nested<0> {
    using Type = int;
};

}  // namespace

TEST(TypeName, IsDemangled) {
    EXPECT_STREQ(getTypeName(typeid(String)), "Foundation::String");
    EXPECT_STREQ(getTypeName(typeid(int)), "int");
}

TEST(TypeName, StandsInOneBufferOf255Bytes) {
    const char* const name = getTypeName(typeid(Nested<8>::Type));
    EXPECT_EQ(std::strlen(name), 254u);
    EXPECT_EQ(std::string(name).substr(0, 13), "std::map<int,");
    EXPECT_EQ(getTypeName(typeid(int)), name);
    EXPECT_STREQ(name, "int");
}

TEST(TypeName, KnowsPointersThatCannotBeOnes) {
    EXPECT_TRUE(isBadPointer(nullptr));
    EXPECT_TRUE(isBadPointer(at(4)));
    EXPECT_TRUE(isBadPointer(at(65532)));
    EXPECT_FALSE(isBadPointer(at(65536)));
    EXPECT_TRUE(isBadPointer(at(65537)));
    EXPECT_TRUE(isBadPointer(at(65538)));
    EXPECT_TRUE(isBadPointer(at(65539)));
    EXPECT_FALSE(isBadPointer(at(UINTPTR_MAX - 65535)));
    EXPECT_TRUE(isBadPointer(at(UINTPTR_MAX - 65531)));
    EXPECT_TRUE(isBadPointer(at(UINTPTR_MAX)));
    const int value = 0;
    EXPECT_FALSE(isBadPointer(&value));
}

TEST(TypeName, StandsBehindTheTextOfABadObject) {
    const AutoreleasePool pool;
    EXPECT_EQ(ToString(static_cast<const PFRefCounted*>(at(0x1000)))->utf8(), "BAD_OBJECT(0x1000)");
    EXPECT_EQ(ToString(static_cast<const RefCounted*>(at(0x100002)))->utf8(),
              "BAD_OBJECT(0x100002)");
    EXPECT_EQ(ToString(static_cast<const RefCounted*>(nullptr)), nullptr);
    EXPECT_EQ(OVFormat("%@", static_cast<const String*>(at(0x1000))), "BAD_OBJECT(0x1000)");
}
