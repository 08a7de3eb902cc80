#include "FeedParser/Friend.h"

#include "Foundation/AutoreleasePool.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using Orvane::Friend;

namespace {

std::string nameOf(const char* name, const char* first, const char* family, const char* nick) {
    const AutoreleasePool pool;
    const Ref<Friend> person(new Friend);
    person->mName = String::string(name);
    person->mFirstName = String::string(first);
    person->mFamilyName = String::string(family);
    person->mNick = String::string(nick);
    const String* found = person->getName();
    EXPECT_EQ(found, person->mDisplayName.get());
    return found ? found->utf8() : "(null)";
}

TEST(Friend, IsCalledByTheBestNameThatThereIs) {
    EXPECT_EQ(nameOf("N", "F", "G", "K"), "N");
    EXPECT_EQ(nameOf(nullptr, "F", "G", "K"), "F G");
    EXPECT_EQ(nameOf(nullptr, "F", nullptr, "K"), "F");
    EXPECT_EQ(nameOf(nullptr, nullptr, "G", "K"), "K");
    EXPECT_EQ(nameOf(nullptr, nullptr, "G", nullptr), "(null)");
}

}  // namespace
