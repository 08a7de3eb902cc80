#include "Foundation/NetException.h"
#include "Model/EnclosureTest.h"

#include <filesystem>
#include <fstream>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

namespace fs = std::filesystem;

class EnclosureDownloadsTest : public EnclosureTest {
 protected:
    EnclosureDownloadsTest() { row->mLength.setValue(1000); }

    fs::path downloads() const { return directory.path() / "Orvane/Downloads"; }
    fs::path incomplete() const { return downloads() / "Incomplete" / (hash + ".ovdownload"); }
    static void writeFile(const fs::path& file, const std::string& content) {
        fs::create_directories(file.parent_path());
        std::ofstream(file) << content;
    }
    void finish(const fs::path& place) {
        row->mDownloadState.setValue(EnclosureCore::kFinished);
        const Ref<URL> file = URL::urlWithFileSystemPath(place.c_str(), false);
        row->mDownloadedPath.setValue(file.get());
    }
    /// The name that is chosen, or "(elsewhere) path" for one that is not in the directory.
    std::string nameFor(String* suggested) {
        const Ref<URL> file = row->calculateUniqueDownloadFile(suggested);
        const fs::path place = file->getFileSystemRepresentation();
        return place.parent_path() == downloads() ? place.filename().string()
                                                  : "(elsewhere) " + place.string();
    }
    std::string takePosts() {
        std::string result;
        for (const FakeCenter::Post& post : platform.posts)
            result += post.name + " " + post.object + "\n";
        platform.posts.clear();
        return result;
    }

    const Ref<EnclosureCore> row = stored("http://e.org/files/song.mp3", "audio/mpeg");
    const std::string hash = sha1("http://e.org/files/song.mp3");
    FakeDownloaders port;
};

}  // namespace

TEST_F(EnclosureDownloadsTest, KeepsWhatThereIsUnderTheHashOfItsURL) {
    EXPECT_EQ(row->getIncompleteDownloadURL()->getFileSystemRepresentation(),
              incomplete().string());
    EXPECT_TRUE(row->getIncompleteDownloadURL()->hasDirectoryPath());
    EXPECT_EQ(row->getIncompleteDownloadFile()->getFileSystemRepresentation(),
              (incomplete() / "Data").string());
    EXPECT_EQ(row->getIncompleteDownloadURL(), row->getIncompleteDownloadURL());
}

TEST_F(EnclosureDownloadsTest, HasNoPlaceWithoutAURL) {
    const Ref<EnclosureCore> nothing = make<EnclosureCore>();
    EXPECT_EQ(nothing->getIncompleteDownloadURL(), nullptr);
    EXPECT_EQ(nothing->getIncompleteDownloadFile(), nullptr);
    EXPECT_EQ(nothing->getDownloadProgress(), 0.0);
    EXPECT_FALSE(nothing->deleteDownload());
}

TEST_F(EnclosureDownloadsTest, StartsItsDownloaderInDirectoriesThatAreThere) {
    EXPECT_TRUE(row->download());
    EXPECT_TRUE(fs::is_directory(downloads() / "Incomplete"));
    EXPECT_EQ(port.calls, "make(1) start ");
    EXPECT_TRUE(row->download());
    EXPECT_EQ(port.calls, "make(1) start start ");
}

TEST_F(EnclosureDownloadsTest, CannotStartWithoutDownloaders) {
    const LogCapture log;
    DownloaderFactory::setCurrent(nullptr);
    EXPECT_FALSE(row->download());
    EXPECT_TRUE(row->mDownloadState == EnclosureCore::kNoDownload);
}

TEST_F(EnclosureDownloadsTest, CancellingStopsAndTellsAndIsRemembered) {
    row->download();
    row->mDownloadState.setValue(EnclosureCore::kDownloading);
    port.bytes = 77;
    port.calls.clear();
    EXPECT_TRUE(row->cancelDownload());
    EXPECT_EQ(row->mDownloadState, 4);
    EXPECT_EQ(row->mDownloadErrorDomain, 15);
    EXPECT_EQ(row->mDownloadErrorCode, -999);
    EXPECT_EQ(takePosts(), "com.tarnwick.orvane.EnclosureDownloadEnded 1,1,77\n");
    port.calls.clear();
    // The downloader is dropped, so that the next one is another.
    row->download();
    EXPECT_EQ(port.calls, "make(1) start ");
}

TEST_F(EnclosureDownloadsTest, CancellingWhatDoesNotLoadChangesNothing) {
    for (const int state : {0, 1, 3, 4, 5}) {
        row->mDownloadState.setValue(state);
        EXPECT_TRUE(row->cancelDownload());
        EXPECT_EQ(row->mDownloadState, state);
        EXPECT_EQ(row->mDownloadErrorCode, 0);
    }
    EXPECT_EQ(takePosts(), "");
}

TEST_F(EnclosureDownloadsTest, CancellingWhatOnlyWaitsStopsIt) {
    row->download();
    row->mDownloadState.setValue(EnclosureCore::kRequested);
    row->cancelDownload();
    EXPECT_EQ(row->mDownloadState, 1);
    EXPECT_NE(port.calls.find("interrupt "), std::string::npos);
    EXPECT_EQ(takePosts(), "com.tarnwick.orvane.EnclosureDownloadEnded 1,1,0\n");
}

TEST_F(EnclosureDownloadsTest, TellsOfItsDownloadByIDs) {
    row->postDownloadStarted();
    row->download();
    port.bytes = 5000000000;
    row->postDownloadProgress();
    row->postDownloadEnded();
    EXPECT_EQ(takePosts(),
              "com.tarnwick.orvane.EnclosureDownloadStarted 1,1,0\n"
              "com.tarnwick.orvane.EnclosureDownloadProgress 1,1,5000000000\n"
              "com.tarnwick.orvane.EnclosureDownloadEnded 1,1,5000000000\n");
    row->postDownloadEnded();
    EXPECT_EQ(takePosts(), "com.tarnwick.orvane.EnclosureDownloadEnded 1,1,0\n");
    const Ref<EnclosureCore> alone = enclosure("http://e.org/x");
    alone->postDownloadStarted();
    EXPECT_EQ(takePosts(), "com.tarnwick.orvane.EnclosureDownloadStarted 0,0,0\n");
}

TEST_F(EnclosureDownloadsTest, TellsOfItsDownloadWhenItsEntryIsGone) {
    row->download();
    db().saveRows();
    db().execute("delete from Entries");
    TableOf<EntryCore>::instance()->uncacheRows();
    EXPECT_EQ(row->getEntry(), nullptr);
    row->postDownloadEnded();
    EXPECT_EQ(takePosts(), "com.tarnwick.orvane.EnclosureDownloadEnded 0,1,0\n");
}

TEST_F(EnclosureDownloadsTest, DeletesTheFileAndWhatThereIsOfOne) {
    writeFile(incomplete() / "Data", "12345");
    writeFile(downloads() / "song.mp3", "1234567890");
    finish(downloads() / "song.mp3");
    EXPECT_TRUE(row->deleteDownload());
    EXPECT_FALSE(fs::exists(incomplete()));
    EXPECT_FALSE(fs::exists(downloads() / "song.mp3"));
    EXPECT_EQ(row->mDownloadState, 5);
    EXPECT_EQ(row->mDownloadedPath.getValue(), nullptr);
    EXPECT_FALSE(row->deleteDownload());
}

TEST_F(EnclosureDownloadsTest, DeletingWhatIsPartlyThereLeavesTheState) {
    writeFile(incomplete() / "Data", "12345");
    row->mDownloadState.setValue(EnclosureCore::kFailed);
    EXPECT_TRUE(row->deleteDownload());
    EXPECT_EQ(row->mDownloadState, 4);
}

TEST_F(EnclosureDownloadsTest, DeletingAFileThatIsGoneForgetsItsPlace) {
    const LogCapture log;
    finish(downloads() / "song.mp3");
    EXPECT_FALSE(row->deleteDownload());
    EXPECT_EQ(row->mDownloadState, 3);
    EXPECT_EQ(row->mDownloadedPath.getValue(), nullptr);
}

TEST_F(EnclosureDownloadsTest, DeletingStopsTheDownload) {
    row->download();
    row->mDownloadState.setValue(EnclosureCore::kDownloading);
    row->deleteDownload();
    EXPECT_NE(port.calls.find("interrupt "), std::string::npos);
    EXPECT_EQ(row->getDownloadError(), NetError(15, -999));
}

TEST_F(EnclosureDownloadsTest, NotesThatItsFileIsGone) {
    writeFile(downloads() / "song.mp3", "1");
    finish(downloads() / "song.mp3");
    EXPECT_FALSE(row->wasDownloadDeleted());
    EXPECT_TRUE(row->checkDownload());
    EXPECT_EQ(row->mDownloadState, 3);
    fs::remove(downloads() / "song.mp3");
    EXPECT_TRUE(row->wasDownloadDeleted());
    EXPECT_TRUE(row->checkDownload());
    EXPECT_EQ(row->mDownloadState, 5);
    EXPECT_EQ(row->mDownloadedPath.getValue(), nullptr);
    EXPECT_FALSE(row->wasDownloadDeleted());
}

TEST_F(EnclosureDownloadsTest, KeepsItsError) {
    EXPECT_EQ(row->getDownloadError(), NetError::None);
    row->setDownloadError({NetError::kHTTP, 404});
    EXPECT_EQ(row->getDownloadError(), NetError(NetError::kHTTP, 404));
    EXPECT_EQ(row->mDownloadErrorDomain, NetError::kHTTP);
    EXPECT_EQ(row->mDownloadErrorCode, 404);
}

TEST_F(EnclosureDownloadsTest, AFinishedFileIsWholeWhileItIsThere) {
    writeFile(downloads() / "song.mp3", "1");
    finish(downloads() / "song.mp3");
    EXPECT_EQ(row->getDownloadProgress(), 1.0);
    fs::remove(downloads() / "song.mp3");
    EXPECT_EQ(row->getDownloadProgress(), 0.0);
}

TEST_F(EnclosureDownloadsTest, WithoutALengthThereIsNoProgressUntilItIsFinished) {
    row->mLength.setValue(0);
    writeFile(incomplete() / "Data", "12345");
    EXPECT_EQ(row->getDownloadProgress(), 0.0);
    row->mLength.setValue(-1);
    EXPECT_EQ(row->getDownloadProgress(), 0.0);
    row->mDownloadState.setValue(EnclosureCore::kFinished);
    EXPECT_EQ(row->getDownloadProgress(), 1.0);
}

TEST_F(EnclosureDownloadsTest, TakesItsProgressFromTheBestSource) {
    EXPECT_EQ(row->getDownloadProgress(), 0.0);
    row->setDownloadedBytes(250);
    EXPECT_EQ(row->getDownloadProgress(), 0.0);  // there is no file
    row->setDownloadedBytes(-1);
    writeFile(incomplete() / "Data", std::string(100, 'x'));
    EXPECT_EQ(row->getDownloadProgress(), 0.1);
    row->setDownloadedBytes(250);
    EXPECT_EQ(row->getDownloadProgress(), 0.25);
    row->setDownloadedBytes(0);
    EXPECT_EQ(row->getDownloadProgress(), 0.0);
    row->download();
    port.bytes = 500;
    EXPECT_EQ(row->getDownloadProgress(), 0.5);
    port.bytes = 5000;
    EXPECT_EQ(row->getDownloadProgress(), 1.0);
}

TEST_F(EnclosureDownloadsTest, LogsTheBytesThatItHearsOf) {
    const LogCapture log;
    const LoggingOn on({&gLogDownload});
    row->setDownloadedBytes(250);
    EXPECT_TRUE(
        log.contains("[Download] Notified of 250 downloaded bytes for " + textOf(row->toString())));
}

TEST_F(EnclosureDownloadsTest, IsNamedByTheServerTheURLOrNobody) {
    const LogCapture log;
    const LoggingOn on({&gLogDownload});
    EXPECT_EQ(nameFor(str("Suggested.mp3")), "Suggested.mp3");
    EXPECT_TRUE(log.contains(
        "[Download] calculateUniqueDownloadFile(): downloadFilename is Suggested.mp3"));
    EXPECT_TRUE(
        log.contains("[Download] calculateUniqueDownloadFile(): possiblyNonUniquePath "
                     "file://" +
                     (downloads() / "Suggested.mp3").string()));
    EXPECT_EQ(nameFor(nullptr), "song.mp3");
    row->mURL.setValue(url("http://e.org/"));
    EXPECT_EQ(nameFor(nullptr), "Untitled");
}

TEST_F(EnclosureDownloadsTest, IsNeverNamedLikeAFileThatIsThere) {
    writeFile(downloads() / "song.mp3", "1");
    EXPECT_EQ(nameFor(nullptr), "song-1.mp3");
    fs::create_symlink("nowhere", downloads() / "song-1.mp3");
    EXPECT_EQ(nameFor(nullptr), "song-2.mp3");
}

TEST_F(EnclosureDownloadsTest, NoNameFromTheNetworkLeadsElsewhere) {
    EXPECT_EQ(nameFor(str("../../../etc/passwd")), "passwd");
    EXPECT_EQ(nameFor(str("/etc/passwd")), "passwd");
    EXPECT_EQ(nameFor(str("..\\..\\boot.ini")), "boot.ini");
    EXPECT_EQ(nameFor(str(".bashrc")), "bashrc");
    EXPECT_EQ(nameFor(str("a\nb.mp3")), "ab.mp3");
    EXPECT_EQ(nameFor(str("..")), "song.mp3");
    row->mURL.setValue(url("http://e.org/a/..%2F..%2Fpasswd"));
    EXPECT_EQ(nameFor(nullptr), "passwd");
    row->mURL.setValue(url("http://e.org/a/%2E%2E%2F"));
    EXPECT_EQ(nameFor(str("...")), "Untitled");
    EXPECT_EQ(nameFor(str("100%25 & more?.mp3")), "100%25 & more?.mp3");
}

TEST_F(EnclosureDownloadsTest, ALongNameStaysShortEnoughWithItsNumber) {
    const std::string name = std::string(251, 'a') + ".mp3";
    EXPECT_EQ(nameFor(str(name)), name);
    writeFile(downloads() / name, "1");
    EXPECT_EQ(nameFor(str(name)), std::string(249, 'a') + ".mp3");
    EXPECT_EQ(nameFor(str(std::string(300, 'a') + ".mp3")), std::string(249, 'a') + ".mp3");
}

TEST_F(EnclosureDownloadsTest, AsksTheAgentWhereItMayOnlyBeRead) {
    db().saveRows();
    reopen(false);
    RecordingAgent agent;
    const Ref<EnclosureCore> read = EnclosureCore::getRow(1);
    ASSERT_EQ(read->mLength, 1000);
    EXPECT_TRUE(read->download());
    EXPECT_FALSE(read->mDownloadState.isLoaded());
    ASSERT_EQ(read->mLength, 1000);
    EXPECT_TRUE(read->cancelDownload());
    EXPECT_FALSE(read->mDownloadState.isLoaded());
    EXPECT_TRUE(read->checkDownload());
    EXPECT_TRUE(read->deleteDownload());
    EXPECT_EQ(agent.calls,
              "enclosureAction(1,0) enclosureAction(1,2) enclosureAction(1,1) "
              "enclosureAction(1,3) ");
    agent.answer = false;
    EXPECT_FALSE(read->download());
    EXPECT_FALSE(read->cancelDownload());
    EXPECT_FALSE(read->checkDownload());
    EXPECT_FALSE(read->deleteDownload());
    EXPECT_EQ(port.calls, "");
}
