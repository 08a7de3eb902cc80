#include "Net/ReadAheadFileReader.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/URL.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

class ReadAheadFileReaderTest : public testing::Test {
 protected:
    ~ReadAheadFileReaderTest() noexcept override = default;

    /// "null" for what cannot be read.
    static std::string read(const std::string& path, bool readsAhead = true) {
        URL* url = URL::urlWithFileSystemPath(path.c_str(), false);
        const Ref<Data> data = ReadAheadFileReader(url, readsAhead).finish();
        return data.get() ? std::string(data->view()) : "null";
    }

    AutoreleasePool pool;
    Support::TempDir files;
};

}  // namespace

TEST_F(ReadAheadFileReaderTest, ReadsAWholeFile) {
    const std::string big(200'001, 'x');
    EXPECT_EQ(read(files.writeFile("a", "words")), "words");
    EXPECT_EQ(read(files.writeFile("b", big)), big);
    EXPECT_EQ(read(files.writeFile("c", "")), "");
    EXPECT_EQ(read(files / "a", false), "words");
}

TEST_F(ReadAheadFileReaderTest, ReadsWhatIsThereWhenItIsWaitedFor) {
    URL* url = URL::urlWithFileSystemPath(files.writeFile("a", "one").c_str(), false);
    ReadAheadFileReader reader(url, true);
    files.writeFile("a", "one and two");
    const Ref<Data> data = reader.finish();
    EXPECT_EQ(data->view(), "one and two");
}

TEST_F(ReadAheadFileReaderTest, GivesNothingForWhatIsNoPlainFile) {
    EXPECT_EQ(read(files / "none"), "null");
    EXPECT_EQ(read(files.makeDirectory("folder")), "null");
    const std::string pipe = files / "pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    EXPECT_EQ(read(pipe), "null");
    EXPECT_EQ(ReadAheadFileReader(nullptr, true).finish().detach(), nullptr);
}
