#include "Net/URLDownload.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Guard.h"
#include "Net/Connection.h"
#include "Net/SuggestedFilename.h"
#include "Utilities/FileUtils.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

namespace Orvane {

using Foundation::callGuarded;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

double now() {
    return Foundation::Clock::current().now();
}

}  // namespace

/// The barrier between the connection and the download. What comes before a body is over already.
class URLDownload::Client : public ConnectionClient {
 public:
    explicit Client(URLDownload* download) : mOwner(download) {}

    Returner<ConnectionRequest> willSendRequest(ConnectionRequest* request,
                                                ConnectionResponse*) noexcept override {
        return Returner<ConnectionRequest>::retained(request);
    }
    void didReceiveResponse(ConnectionResponse*) noexcept override {}
    void didReceiveAuthenticationChallenge(AuthenticationChallenge*) noexcept override {}
    void didReceiveData(Foundation::Data* data, long) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didReceiveData(data->view()); });
    }
    void didFinishLoading() noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFinish(NetError::None); });
    }
    void didFail(NetError error) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFinish(error); });
    }
    void didFail(ConnectionError* error) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFinish(error->toLoadingError()); });
    }

 private:
    template <class Body>
    void guarded(const char* where, Body body) noexcept {
        callGuarded(where, [&] {
            const Ref<URLDownload> owner(mOwner);
            body();
        });
    }

    URLDownload* const mOwner;
};

URLDownload::URLDownload(Connection* connection, const ConnectionRequest* request,
                         ConnectionResponse* response, URL* destination)
    : mDestination(destination),
      mDownload(connection),
      mResponse(response),
      mLastProgress(now()),
      mClient(std::make_unique<Client>(this)),
      mCreateTimer(this, &URLDownload::createFile) {
    OV_ASSERT(connection && request && response);
    OV_ASSERT(destination);
    connection->setClient(mClient.get());
    // Once its maker has bound the actions.
    mCreateTimer.start(0.0, false);
}

URLDownload::~URLDownload() {
    if (mDownload) mDownload->cancel();
}

void URLDownload::stop() {
    mCreateTimer.stop();
    mFile.close();
    if (!mDownload) return;
    const Ref<Connection> connection = std::move(mDownload);
    connection->cancel();
}

void URLDownload::createFile() {
    // Those who hear of it may let it go.
    const Ref<URLDownload> self(this);
    createFileIfNeeded();
}

bool URLDownload::createFileIfNeeded() {
    mCreateTimer.stop();
    if (mFile) return true;
    const Ref<String> name = suggestedFilename(*mResponse);
    _chooseDestinationForFilename(name);
    constexpr mode_t kOwnerOnly = 0600;
    const std::string path = mDestination->getFileSystemRepresentation();
    mFile = Foundation::UniqueFD(
        ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NOFOLLOW, kOwnerOnly));
    if (!mFile) {
        _didFinish(NetError(NetError::kPOSIX, errno));
        return false;
    }
    mCreatedFile.invoke(this);
    return mDownload.get() != nullptr;
}

void URLDownload::_chooseDestinationForFilename(String* name) {
    gLogDownload.log("%@: Suggested filename is \"%@\"; downloading to <%@> (exists=%i)", this,
                     name, mDestination, static_cast<int>(FileUtils::exists(mDestination)));
    mSuggestedFilename = name;
}

void URLDownload::_didReceiveData(std::string_view block) {
    if (!createFileIfNeeded()) return;
    if (!write(block)) return _didFinish(NetError(NetError::kPOSIX, errno));
    mBytesDownloaded += block.size();
    if (now() - mLastProgress < kProgressSeconds) return;
    mLastProgress = now();
    const Ref<String> lengthName = String::string("Content-Length");
    const Ref<String> length = getHTTPResponse()->getHeader(lengthName);
    gLogDownload.log("%@: Got %llu bytes of %llu", this,
                     static_cast<unsigned long long>(mBytesDownloaded),
                     static_cast<unsigned long long>(String::toLongLong(length)));
    mGotData.invoke(this);
}

bool URLDownload::write(std::string_view block) {
    while (!block.empty()) {
        const ssize_t written = ::write(mFile.get(), block.data(), block.size());
        if (written < 0 && errno == EINTR) continue;
        if (written < 0) return false;
        block.remove_prefix(static_cast<std::size_t>(written));
    }
    return true;
}

void URLDownload::_didFinish(NetError error) {
    // An empty file is one too.
    if (error.code == 0 && !createFileIfNeeded()) return;
    gLogDownload.log("%@: Finished, error = %@", this, error);
    mError = error;
    stop();
    (error.code != 0 ? mFailed : mFinished).invoke(this);
}

}  // namespace Orvane
