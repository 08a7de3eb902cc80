#pragma once

#include "Foundation/Action.h"
#include "Foundation/NetError.h"
#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/Timer.h"
#include "Foundation/URL.h"
#include "Foundation/UniqueFD.h"
#include "Net/ConnectionRequest.h"
#include "Net/ConnectionResponse.h"

#include <cstdint>
#include <memory>
#include <string_view>

namespace Orvane {

class Connection;

/// Writes into a file what a connection brings that a request has begun. What has come stays there
/// if it fails. On the thread of the run loop.
class URLDownload : public Foundation::RefCounted {
 public:
    static constexpr double kProgressSeconds = 1.0;

    ActionOf<URLDownload> mCreatedFile;
    ActionOf<URLDownload> mGotData;  ///< at most every `kProgressSeconds`
    ActionOf<URLDownload> mFailed;   ///< see `getError`
    ActionOf<URLDownload> mFinished;

    /// Takes over a connection whose response is here and whose body is still to come. Overwrites
    /// the file at `destination`. Throws `AssertionFailure` for null.
    URLDownload(Connection* connection, const ConnectionRequest* request,
                ConnectionResponse* response, Foundation::URL* destination);
    ~URLDownload() override;

    /// Ends it without an action.
    void stop();

    Foundation::NetError getError() const { return mError; }
    HTTPMessage* getHTTPResponse() const { return mResponse->getHTTPMessage(); }
    /// Whether the server can send the rest of the file at another time.
    bool isResumeable() const { return getHTTPResponse()->hasHeader("Accept-Ranges"); }
    std::uint64_t getBytesDownloaded() const { return mBytesDownloaded; }
    Foundation::URL* getDestination() const { return mDestination; }
    /// See `suggestedFilename`. Null before `mCreatedFile`.
    Foundation::String* getSuggestedFilename() const { return mSuggestedFilename; }

 private:
    class Client;

    /// False, with the end of the download, if there can be no file.
    bool createFileIfNeeded();
    void createFile();
    void _chooseDestinationForFilename(Foundation::String* name);
    void _didReceiveData(std::string_view block);
    void _didFinish(Foundation::NetError error);
    bool write(std::string_view block);

    Foundation::Ref<Foundation::URL> mDestination;
    Foundation::Ref<Connection> mDownload;  ///< while it runs
    Foundation::Ref<ConnectionResponse> mResponse;
    Foundation::NetError mError;
    Foundation::Ref<Foundation::String> mSuggestedFilename;
    std::uint64_t mBytesDownloaded = 0;
    double mLastProgress;
    Foundation::UniqueFD mFile;
    std::unique_ptr<Client> mClient;
    Foundation::Timer<URLDownload> mCreateTimer;
};

}  // namespace Orvane
