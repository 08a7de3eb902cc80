#include "Foundation/MIMEType.h"
#include "Model/EntryTest.h"

using namespace Foundation;
using namespace Orvane;

namespace {

class SubscriptionEnclosuresTest : public ModelTest {
 protected:
    bool wants(const char* type) {
        const Ref<MIMEType> mimeType = type ? MIMEType::type(str(type)) : nullptr;
        return subscription->willAutoDownload(mimeType.get());
    }
    bool wants(const char* type, long long length) {
        const Ref<EnclosureCore> row = make<EnclosureCore>();
        if (type) row->mMIMEType.setValue(str(type));
        row->mLength.setValue(length);
        return subscription->willAutoDownload(row.get());
    }

    const Ref<SubscriptionCore> subscription = make<SubscriptionCore>();
};

}  // namespace

TEST_F(SubscriptionEnclosuresTest, JoinsTypesByTabs) {
    const Ref<ArrayOf<String>> types = ArrayOf<String>::array({str("audio/mpeg"), str("video/*")});
    EXPECT_EQ(textOf(SubscriptionCore::serializeEnclosureTypes(types.get())),
              "audio/mpeg\tvideo/*");
    EXPECT_EQ(textOf(SubscriptionCore::serializeEnclosureTypes(nullptr)), "");
    const Ref<ArrayOf<String>> back =
        SubscriptionCore::deserializeEnclosureTypes(str("audio/mpeg\tvideo/*"));
    ASSERT_EQ(back->count(), 2u);
    EXPECT_EQ(textOf(back->at(0)), "audio/mpeg");
    EXPECT_EQ(textOf(back->at(1)), "video/*");
    const Ref<ArrayOf<String>> none = SubscriptionCore::deserializeEnclosureTypes(nullptr);
    EXPECT_EQ(none.get(), nullptr);
    const Ref<ArrayOf<String>> empty = SubscriptionCore::deserializeEnclosureTypes(str(""));
    EXPECT_TRUE(empty->isEmpty());
}

TEST_F(SubscriptionEnclosuresTest, NoTypesAreAllTypes) {
    EXPECT_TRUE(wants("audio/mpeg"));
    EXPECT_TRUE(wants(nullptr));
    subscription->mEnclosureTypesString.setValue(str(""));
    EXPECT_TRUE(wants("audio/mpeg"));
    EXPECT_TRUE(wants(nullptr));
}

TEST_F(SubscriptionEnclosuresTest, WantsTheTypesOnItsList) {
    subscription->mEnclosureTypesString.setValue(str("audio/mpeg\tvideo/*"));
    EXPECT_TRUE(wants("audio/mpeg"));
    EXPECT_TRUE(wants("Audio/MPEG; x=y"));
    EXPECT_TRUE(wants("video/mp4"));
    EXPECT_FALSE(wants("audio/ogg"));
    EXPECT_FALSE(wants(nullptr));
}

TEST_F(SubscriptionEnclosuresTest, WantsNothingUnlessItDownloads) {
    EXPECT_FALSE(wants("audio/mpeg", 1));
    subscription->mDownloadsEnclosures.setValue(true);
    EXPECT_TRUE(wants("audio/mpeg", 1));
}

TEST_F(SubscriptionEnclosuresTest, WantsNothingThatIsTooLarge) {
    subscription->mDownloadsEnclosures.setValue(true);
    subscription->mMaxEnclosureSize.setValue(8388608.0);
    EXPECT_TRUE(wants("audio/mpeg", 8388608));
    EXPECT_FALSE(wants("audio/mpeg", 8388609));
    EXPECT_TRUE(wants("audio/mpeg", 0));
    subscription->mMaxEnclosureSize.setValue(0);
    EXPECT_TRUE(wants("audio/mpeg", 8388609));
}

TEST_F(SubscriptionEnclosuresTest, WantsOnlyItsTypesOfEnclosures) {
    subscription->mDownloadsEnclosures.setValue(true);
    subscription->mEnclosureTypesString.setValue(str("audio/mpeg"));
    EXPECT_TRUE(wants("audio/mpeg", 1));
    EXPECT_FALSE(wants("video/mp4", 1));
    EXPECT_FALSE(wants(nullptr, 1));
}
