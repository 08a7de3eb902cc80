#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/FileErrors.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Support/FileAccess.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cerrno>

using namespace Foundation;

namespace {

/// The files of a directory, by their URLs.
class ResourcesTest : public testing::Test {
 protected:
    /// The URL of a name in the directory; lives as long as the test.
    URL* url(std::string_view name) {
        return mURLs.emplace_back(URL::urlWithFileSystemPath((mDir / name).c_str(), false)).get();
    }
    /// The content of a file, or the error that reading it gives.
    std::string read(URL* from) const {
        NetError error(NetError::kPOSIX, 1);
        const Ref<Data> data = Data::dataFromResource(from, error);
        EXPECT_EQ(data.get() != nullptr, error == NetError::None);
        const Ref<Data> same = Data::dataFromResource(from);
        EXPECT_EQ(same.get() != nullptr, data.get() != nullptr);
        return data ? std::string(data->view()) : OVFormat("%d/%d", error.domain, error.code);
    }

    Support::TempDir mDir;
    Support::LogCapture mLog;
    std::vector<Ref<URL>> mURLs;
};

class DataResource : public ResourcesTest {};
class StringResource : public ResourcesTest {};

}  // namespace

TEST_F(DataResource, IsReadWhole) {
    std::string large(300000, 'x');
    large[150000] = '\0';
    mDir.writeFile("large file", large);
    mDir.writeFile("empty", "");
    EXPECT_EQ(read(url("large file")), large);
    EXPECT_EQ(read(url("empty")), "");
}

TEST_F(DataResource, IsReadFromFilesThatDoNotTellTheirSize) {
    const Ref<URL> file = URL::urlWithFileSystemPath("/proc/self/status", false);
    EXPECT_NE(read(file).find("Threads:"), std::string::npos);
}

TEST_F(DataResource, TellsWhyItCannotBeRead) {
    const Ref<String> web = String::string("http://a/b");
    mkfifo((mDir / "pipe").c_str(), 0600);
    mDir.writeFile("file", "");
    EXPECT_EQ(read(url("missing")), "15/-12");
    EXPECT_EQ(read(url("file/below")), "15/-12");
    const Ref<URL> elsewhere = URL::url(web);
    EXPECT_EQ(read(elsewhere), "15/-11");
    EXPECT_EQ(read(url("")), OVFormat("1/%d", EISDIR));
    EXPECT_EQ(read(url("pipe")), OVFormat("1/%d", EINVAL));
}

TEST_F(DataResource, TellsThatItMayNotBeRead) {
    const std::string path = mDir.writeFile("closed", "secret");
    chmod(mDir.path().c_str(), 0755);
    chmod(path.c_str(), 0000);
    const Support::OrdinaryFileAccess access;
    EXPECT_EQ(read(url("closed")), "15/-13");
}

TEST_F(DataResource, IsWrittenWhole) {
    const Ref<Data> data = Data::adopt(std::string("new\0text", 8));
    mDir.writeFile("file", "an older and longer text");
    NetError error(NetError::kPOSIX, 1);
    EXPECT_TRUE(data->writeToResource(url("file"), error));
    EXPECT_EQ(error, NetError::None);
    EXPECT_EQ(mDir.readFile("file"), data->view());
    EXPECT_TRUE(data->writeToResource(url("other")));
    EXPECT_EQ(mDir.readFile("other"), data->view());
}

TEST_F(DataResource, TellsWhyItCannotBeWritten) {
    const Ref<Data> data = Data::adopt(std::string(10000, 'x'));
    const Ref<String> web = String::string("http://a/b");
    const Ref<URL> elsewhere = URL::url(web);
    NetError error;
    EXPECT_FALSE(data->writeToResource(url("missing/file"), error));
    EXPECT_EQ(error, NetError(NetError::kPFURL, FileURLError::kNotFound));
    EXPECT_FALSE(data->writeToResource(elsewhere, error));
    EXPECT_EQ(error, NetError(NetError::kPFURL, FileURLError::kNotLocal));
    const Support::FileSizeLimit limit(4096);
    EXPECT_FALSE(data->writeToResource(url("file"), error));
    EXPECT_EQ(error, NetError(NetError::kPOSIX, EFBIG));
    EXPECT_FALSE(data->writeToResource(url("file")));
}

TEST_F(DataResource, AssertsAURL) {
    const Ref<Data> data = Data::adopt("");
    NetError error;
    Ref<Data> read;
    EXPECT_THROW(read = Data::dataFromResource(nullptr, error), AssertionFailure);
    EXPECT_THROW((void)data->writeToResource(nullptr), AssertionFailure);
    try {
        read = Data::dataFromResource(nullptr);
        ADD_FAILURE();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "url!=NULL");
    }
}

TEST_F(StringResource, IsReadAsUTF8) {
    mDir.writeFile("file", "gr\xc3\xbc\xc3\x9f");
    const Ref<String> string = String::stringFromResource(url("file"));
    EXPECT_EQ(string->utf8(), "gr\xc3\xbc\xc3\x9f");
}

TEST_F(StringResource, AssertsAText) {
    mDir.writeFile("latin", "gr\xfc\xdf");
    for (const char* name : {"latin", "missing"}) {
        URL* file = url(name);
        Ref<String> string;
        try {
            string = String::stringFromResource(file);
            ADD_FAILURE() << "read " << name;
        } catch (const AssertionFailure& failure) {
            EXPECT_EQ(failure.what(), OVFormat("Couldn't interpret string data at %@", file));
        }
    }
}

TEST(FileErrors, NameWhatIsMissingOrForbidden) {
    EXPECT_EQ(fileError(0), NetError::None);
    for (const int number : {ENOENT, ENOTDIR}) {
        EXPECT_EQ(fileError(number), NetError(15, -12));
    }
    for (const int number : {EACCES, EPERM, EROFS}) {
        EXPECT_EQ(fileError(number), NetError(15, -13));
    }
    EXPECT_EQ(fileError(ENOSPC), NetError(1, ENOSPC));
}
