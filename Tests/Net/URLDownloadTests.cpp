#include "Net/URLDownload.h"

#include "Net/SuggestedFilename.h"
#include "NetTest.h"
#include "Support/AssertionOf.h"
#include "Support/TempDir.h"

using namespace Orvane;

namespace {

using Notes = std::vector<std::string>;

class URLDownloadTest : public NetTest {
 protected:
    /// Begins a request that becomes a download into `path` with its response.
    void begin(const std::string& path, std::vector<HTTPHeader> headers = {}) {
        mPath = path;
        mRequest = get("http://a/dir/file.mp3");
        mRequest->setAccumulatesData(false);
        mRequest->mGotResponse.setReceiver(receiver(this, &URLDownloadTest::gotResponse));
        mRequest->start(false);
        turn();
        network().pending()[0]->sendHead(200, std::move(headers));
    }
    void gotResponse(URLRequest* request) {
        const Ref<Foundation::URL> destination =
            Foundation::URL::urlWithFileSystemPath(mPath.c_str(), false);
        mDownload = request->startDownloadToFile(destination);
        mDownload->mCreatedFile.setReceiver(receiver(this, &URLDownloadTest::createdFile));
        mDownload->mGotData.setReceiver(receiver(this, &URLDownloadTest::gotData));
        mDownload->mFailed.setReceiver(receiver(this, &URLDownloadTest::failed));
        mDownload->mFinished.setReceiver(receiver(this, &URLDownloadTest::finished));
    }
    void createdFile(URLDownload* download) {
        mNotes.push_back("created " + download->getSuggestedFilename()->utf8());
    }
    void gotData(URLDownload* download) {
        mNotes.push_back("data " + std::to_string(download->getBytesDownloaded()));
    }
    void failed(URLDownload* download) {
        mNotes.push_back(OVFormat("failed %d %d", static_cast<int>(download->getError().domain),
                                  download->getError().code));
    }
    void letGoWhenItTells() {
        mDownload->mCreatedFile.setReceiver(receiver(this, &URLDownloadTest::letGo));
        mDownload->mFailed.setReceiver(receiver(this, &URLDownloadTest::letGo));
    }
    void letGo(URLDownload*) {
        mDownload = nullptr;
        mNotes.emplace_back("let go");
    }
    void finished(URLDownload*) { mNotes.emplace_back("finished"); }

    Support::TempDir mDirectory;
    std::string mPath;
    Ref<HTTPRequest> mRequest;
    Ref<URLDownload> mDownload;
    Notes mNotes;
};

TEST_F(URLDownloadTest, TakesTheConnectionOverAndWritesTheBody) {
    begin(mDirectory.writeFile("file", "what was there before"));
    EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
    network().pending()[0]->sendBody("one ");
    network().pending()[0]->sendBody("two");
    network().pending()[0]->end();
    EXPECT_EQ(mNotes, (Notes{"created file.mp3", "finished"}));
    EXPECT_EQ(mDirectory.readFile("file"), "one two");
    EXPECT_EQ(mDownload->getBytesDownloaded(), 7u);
}

TEST_F(URLDownloadTest, MakesTheFileBeforeTheBodyComes) {
    begin(mDirectory / "file");
    EXPECT_TRUE(mNotes.empty());
    turn();
    EXPECT_EQ(mNotes, Notes{"created file.mp3"});
    mDownload->stop();
    EXPECT_TRUE(network().pending().empty());
}

TEST_F(URLDownloadTest, MakesAnEmptyFileOfAnEmptyBody) {
    begin(mDirectory / "file");
    network().pending()[0]->end();
    EXPECT_EQ(mNotes, (Notes{"created file.mp3", "finished"}));
    EXPECT_EQ(mDirectory.readFile("file"), "");
}

TEST_F(URLDownloadTest, TellsOfProgressAtMostOnceASecond) {
    const Support::LoggingOn on({&gLogDownload});
    const Support::LogCapture log;
    begin(mDirectory / "file", {{"Content-Length", "100"}});
    for (int i = 0; i < 10; ++i) {
        network().pending()[0]->sendBody("x");
        mClock.advanceBy(0.25);
    }
    EXPECT_EQ(mNotes, (Notes{"created file.mp3", "data 5", "data 9"}));
    EXPECT_EQ(log.count(": Got 5 bytes of 100"), 1);
    mDownload->stop();
}

TEST_F(URLDownloadTest, KeepsWhatHasComeIfItFails) {
    begin(mDirectory / "file");
    network().pending()[0]->sendBody("half");
    network().pending()[0]->end(
        {.failure = ConnectionError::error(ConnectionError::kNetworkDomain, -1005, "lost")});
    EXPECT_EQ(mNotes, (Notes{"created file.mp3", "failed 15 -1005"}));
    EXPECT_EQ(mDirectory.readFile("file"), "half");
}

TEST_F(URLDownloadTest, FailsWhereThereCanBeNoFile) {
    begin(mDirectory / "missing/file");
    network().pending()[0]->sendBody("x");
    EXPECT_EQ(mNotes, Notes{"failed 1 2"});
    EXPECT_TRUE(network().pending().empty());
    turn();
    EXPECT_EQ(mNotes.size(), 1u);
}

TEST_F(URLDownloadTest, MayBeLetGoByWhoHearsOfItsFile) {
    for (const char* path : {"file", "missing/file"}) {
        begin(mDirectory / path);
        letGoWhenItTells();
        turn();
        EXPECT_EQ(mDownload.get(), nullptr);
        EXPECT_TRUE(network().pending().empty());
    }
    EXPECT_EQ(mNotes, (Notes{"let go", "let go"}));
}

TEST_F(URLDownloadTest, CanBeResumedWhereTheServerSaysSo) {
    begin(mDirectory / "a");
    EXPECT_FALSE(mDownload->isResumeable());
    mDownload->stop();
    begin(mDirectory / "b", {{"Accept-Ranges", "bytes"}});
    EXPECT_TRUE(mDownload->isResumeable());
    mDownload->stop();
}

TEST_F(URLDownloadTest, NeedsAResponseAndNoData) {
    const auto request = get("http://a/");
    EXPECT_EQ(Support::assertionOf(
                  [&] { static_cast<void>(request->startDownloadToFile(url("file:///x").get())); }),
              "mResponse");
    network().answer("http://a/", {.body = "x"});
    request->start(true);
    turn();
    EXPECT_EQ(Support::assertionOf(
                  [&] { static_cast<void>(request->startDownloadToFile(url("file:///x").get())); }),
              "!mResponseData");
}

TEST_F(URLDownloadTest, TakesItsNameFromTheServer) {
    const auto nameFor = [&](const char* address, const char* disposition) {
        const Ref<HTTPMessage> asked = HTTPMessage::request(text("GET").get(), url(address).get());
        const Ref<HTTPMessage> message =
            HTTPMessage::response(200, {{"Content-Disposition", disposition}});
        const Ref<ConnectionResponse> response = ConnectionResponse::response(asked, message, 0);
        return Ref<Foundation::String>(suggestedFilename(*response))->utf8();
    };
    EXPECT_EQ(nameFor("http://a/x%20y.mp3?q", ""), "x y.mp3");
    EXPECT_EQ(nameFor("http://a/", ""), "download");
    EXPECT_EQ(nameFor("http://a/x", "attachment; filename=b.mp3"), "b.mp3");
    EXPECT_EQ(nameFor("http://a/x", "attachment; FileName = \"b; \\\"c\\\".mp3\"; z=1"),
              "b; \"c\".mp3");
    EXPECT_EQ(nameFor("http://a/x", "attachment; filename*=UTF-8''%e2%82%ac.mp3; filename=e.mp3"),
              "\xe2\x82\xac.mp3");
    EXPECT_EQ(nameFor("http://a/x", "attachment; filename*=iso-8859-1'en'%A3; filename=e"),
              "\xc2\xa3");
    EXPECT_EQ(nameFor("http://a/x", "attachment; filename*=none''%A3; filename=e"), "e");
    EXPECT_EQ(nameFor("http://a/x", "attachment; filename=\"../../etc/passwd\""), "passwd");
    EXPECT_EQ(nameFor("http://a/x", "inline"), "x");
}

}  // namespace
