#include "Model/EnclosureCore.h"

#include "Model/EntryCore.h"
#include "Model/ModelTest.h"
#include "Model/Values.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

EnclosureCore* enclosure(const char* location, const char* type = nullptr, long long length = 0) {
    EnclosureCore* row = make<EnclosureCore>();
    row->mURL.setValue(url(location));
    if (type) row->mMIMEType.setValue(str(type));
    row->mLength.setValue(length);
    return row;
}

class EnclosureCoreTest : public ModelTest {};

}  // namespace

TEST_F(EnclosureCoreTest, DescribesItself) {
    EXPECT_EQ(textOf(enclosure("http://e.org/a.mp3", "audio/mpeg", 1536)->toString()),
              "Orvane::EnclosureCore[<http://e.org/a.mp3> audio/mpeg 2KB]");
}

TEST_F(EnclosureCoreTest, DescribesItselfByItsRowWhatIsNotRead) {
    const Ref<EnclosureCore> row = enclosure("http://e.org/a.mp3");
    row->saveChanges();
    row->unload();
    EXPECT_TRUE(row->toString()->hasPrefix("Orvane::EnclosureCore[Enclosures #1]"));
}

TEST_F(EnclosureCoreTest, MatchesByURL) {
    const Ref<EnclosureCore> a = enclosure("http://e.org/a", "audio/mpeg", 1);
    const Ref<EnclosureCore> b = enclosure("http://e.org/b", "audio/mpeg", 1);
    const Ref<EnclosureCore> secondB = enclosure("http://e.org/b", "video/mp4", 2);
    const Ref<ArrayOf<EnclosureCore>> list =
        ArrayOf<EnclosureCore>::array({a.get(), b.get(), secondB.get()});
    EXPECT_EQ(enclosure("http://e.org/b")->matchingEnclosureFrom(list), b.get());
    EXPECT_EQ(enclosure("http://e.org/c")->matchingEnclosureFrom(list), nullptr);
}

TEST_F(EnclosureCoreTest, LinksItselfIntoItsEntry) {
    const Ref<EntryCore> entry = make<EntryCore>();
    const Ref<EntryCore> other = make<EntryCore>();
    const Ref<EnclosureCore> row = enclosure("http://e.org/a");
    row->setEntry(entry.get());
    EXPECT_EQ(entry->getEnclosures(nullptr).getRow(), row.get());
    row->setEntry(other.get());
    EXPECT_FALSE(entry->getEnclosures(nullptr).hasRow());
    EXPECT_EQ(other->getEnclosures(nullptr).getRow(), row.get());
    EXPECT_EQ(row->getEntry(), other.get());
    row->setEntry(nullptr);
    EXPECT_FALSE(other->getEnclosures(nullptr).hasRow());
    EXPECT_EQ(row->getEntry(), nullptr);
}

TEST_F(EnclosureCoreTest, LeavesItsEntryToOthers) {
    const Ref<EntryCore> entry = make<EntryCore>();
    const Ref<EnclosureCore> row = enclosure("http://e.org/a");
    row->setEntry(entry.get());
    EXPECT_EQ(entry->getRefCount(), 1u);
}

TEST_F(EnclosureCoreTest, LosesAnEntryThatEnds) {
    const Ref<EnclosureCore> row = enclosure("http://e.org/a");
    {
        const AutoreleasePool inner;
        const Ref<EntryCore> entry = make<EntryCore>();
        row->setEntry(entry.get());
    }
    EXPECT_EQ(row->getEntry(), nullptr);
}
