#include <Orvane/OVEnclosure.h>

#include "Bridges/BridgeTest.h"

#include <filesystem>

using namespace Foundation;
using namespace Orvane;

namespace {

class OVEnclosureTest : public BridgeTest {
 protected:
    /// That of a row with these further columns.
    std::shared_ptr<OVEnclosure> stored(const std::string& columns = {},
                                        const std::string& values = {}) {
        const long long feed = addFeed(kAddress);
        const long long entry = addEntry(feed, "e1");
        write(
            OVFormat("insert into Enclosures (entry,url,mimeType,length,title%s) values "
                     "(%lli,'http://e.org/a.mp3','audio/mpeg',7,'T'%s)",
                     columns, entry, values));
        std::shared_ptr<OVEnclosure> made = me()->enclosures().at(0);
        return made;
    }
};

}  // namespace

TEST_F(OVEnclosureTest, GivesItsColumns) {
    const std::shared_ptr<OVEnclosure> enclosure = stored();
    EXPECT_EQ(enclosure->URL(), "http://e.org/a.mp3");
    EXPECT_EQ(enclosure->MIMEType(), "audio/mpeg");
    EXPECT_EQ(enclosure->title(), "T");
    EXPECT_EQ(enclosure->length(), 7);
    EXPECT_EQ(enclosure->downloadState(), OVEnclosure::NoDownload);
    EXPECT_EQ(enclosure->downloadProgress(), 0.0);
    EXPECT_FALSE(enclosure->downloadError());
    EXPECT_FALSE(enclosure->downloadedPath());
    EXPECT_EQ(enclosure->entry()->identifier(), "e1");
    EXPECT_EQ(enclosure->entry()->feed(), feedOf());
    EXPECT_EQ(enclosure->description(), "OVEnclosure[<http://e.org/a.mp3> 1]");
    EXPECT_TRUE(enclosure->isEqual(me()->enclosures().at(0).get()));
}

TEST_F(OVEnclosureTest, IsMadeOfAURL) {
    const auto enclosure = OVEnclosure::create("http://e.org/b", "a/b", 12);
    EXPECT_EQ(enclosure->URL(), "http://e.org/b");
    EXPECT_EQ(enclosure->MIMEType(), "a/b");
    EXPECT_EQ(enclosure->length(), 12);
    EXPECT_FALSE(enclosure->entry());
    EXPECT_NE(exceptionOf([] { OVEnclosure::create("", {}, 0); }).find("url"), std::string::npos);
}

TEST_F(OVEnclosureTest, IsMadeOfALocalFile) {
    const std::string file = directory.writeFile("song.MP3", "12345");
    const auto enclosure = OVEnclosure::createFromFile(file);
    ASSERT_TRUE(enclosure);
    EXPECT_EQ(enclosure->MIMEType(), "audio/mpeg");
    EXPECT_EQ(enclosure->length(), 5);
    EXPECT_EQ(enclosure->URL(), "file://" + file);
    EXPECT_EQ(OVEnclosure::createFromFile(file, "x/y")->MIMEType(), "x/y");
    const std::string link = directory / "link";
    std::filesystem::create_symlink(file, link);
    EXPECT_EQ(OVEnclosure::createFromFile(link)->URL(), "file://" + file);
    EXPECT_FALSE(OVEnclosure::createFromFile(directory.writeFile("odd.dyn", "x"))->MIMEType());
    EXPECT_FALSE(OVEnclosure::createFromFile(directory / "missing"));
    EXPECT_FALSE(OVEnclosure::createFromFile(directory.path().string()));
}

TEST_F(OVEnclosureTest, SaysWhichTypeItHasDeduced) {
    const Support::LoggingOn logging({&gLog});
    const std::string file = directory.writeFile("a.txt", "x");
    EXPECT_TRUE(OVEnclosure::createFromFile(file));
    EXPECT_TRUE(log.contains("Deduced MIME type of 'text/plain' for file " + file));
}

TEST_F(OVEnclosureTest, IsNotMadeOfDataYet) {
    EXPECT_FALSE(OVEnclosure::createFromData("x", {}, {}, {}));
    EXPECT_TRUE(log.contains(
        "-[OVEnclosure initWithData:MIMEType:name:extension:] currently unimplemented!"));
}

TEST_F(OVEnclosureTest, IsDownloadedByTheAgent) {
    const std::shared_ptr<OVEnclosure> enclosure = stored();
    std::optional<OVError> error;
    EXPECT_TRUE(enclosure->download(&error));
    EXPECT_EQ(agent->calls, Strings{"enclosureAction(0)"});
    EXPECT_FALSE(error);
    agent->answer = false;
    EXPECT_FALSE(enclosure->download(&error));
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), OVInternalError);
    EXPECT_FALSE(enclosure->download());
    agent->fails = true;
    EXPECT_FALSE(enclosure->download(&error));
    EXPECT_EQ(error->code(), OVAgentLaunchError);
    EXPECT_FALSE(OVEnclosure::create("http://e.org/b", {}, 0)->download(&error));
    EXPECT_EQ(error->code(), OVInternalError);
}

TEST_F(OVEnclosureTest, IsCancelledAndDeletedByTheAgent) {
    const std::shared_ptr<OVEnclosure> enclosure = stored();
    PublicRecorder recorder;
    enclosure->cancelDownload();
    EXPECT_TRUE(recorder.names.empty());
    enclosure->deleteDownload();
    EXPECT_EQ(agent->calls, (Strings{"enclosureAction(2)", "enclosureAction(3)"}));
    EXPECT_EQ(recorder.names, Strings{"OVEnclosureDownloadStateDidChange"});
    EXPECT_EQ(recorder.last.object, enclosure);
    agent->answer = false;
    enclosure->deleteDownload();
    agent->fails = true;
    enclosure->deleteDownload();
    enclosure->cancelDownload();
    EXPECT_EQ(recorder.names.size(), 1u);
}

TEST_F(OVEnclosureTest, KnowsWhatEndedItsDownload) {
    const auto enclosure = stored(",downloadErrorDomain,downloadErrorCode",
                                  OVFormat(",%lli,404", static_cast<long long>(NetError::kHTTP)));
    const std::optional<OVError> error = enclosure->downloadError();
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), OVURLErrorFileDoesNotExist);
    EXPECT_EQ(error->URL(), "http://e.org/a.mp3");
}

TEST_F(OVEnclosureTest, KnowsItsFileWhileThatIsThere) {
    const std::string file = directory.writeFile("a.mp3", "x");
    const auto enclosure = stored(",downloadState,downloadedPath", ",3,'file://" + file + "'");
    EXPECT_EQ(enclosure->downloadedPath(), file);
    EXPECT_EQ(enclosure->downloadProgress(), 1.0);
    EXPECT_TRUE(agent->calls.empty());
    std::filesystem::remove(file);
    EXPECT_FALSE(enclosure->downloadedPath());
    EXPECT_EQ(agent->calls, Strings{"enclosureAction(1)"});
    write("update Enclosures set downloadedPath='http://e.org/x'");
    EXPECT_FALSE(enclosure->downloadedPath());
    EXPECT_EQ(agent->calls.size(), 1u);
}

TEST_F(OVEnclosureTest, HasFailedIfItsStateCannotBeRead) {
    const std::shared_ptr<OVEnclosure> enclosure = stored();
    enclosure->_internal().peek()->unload();
    db().close(false);
    EXPECT_EQ(enclosure->downloadState(), OVEnclosure::Failed);
    EXPECT_EQ(enclosure->downloadProgress(), 0.0);
    EXPECT_FALSE(enclosure->entry());
    EXPECT_NE(exceptionOf([&] { static_cast<void>(enclosure->length()); }), "none");
}
