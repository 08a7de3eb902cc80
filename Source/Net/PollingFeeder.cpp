#include "Net/PollingFeeder.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/RunOnceTimer.h"
#include "Model/CredentialStore.h"

// How a feeder comes by a document; what it does with it is in PollingFeederParsing.cpp.

namespace Orvane {

using Foundation::callAfterDelay;
using Foundation::Data;
using Foundation::Date;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;
using Foundation::StringReturner;
using Foundation::URL;

namespace {

constexpr int kNotModified = 304;

bool isHTTP(const URL& url) {
    return url.isScheme("http") || url.isScheme("https");
}

StringReturner headerOf(const HTTPMessage* response, const char* name) {
    const Ref<String> text = String::string(name);
    return response ? response->getHeader(text.get()) : nullptr;
}

unsigned lengthOf(const Data* data) {
    return static_cast<unsigned>(data ? data->getLength() : 0);
}

}  // namespace

std::int32_t PollingFeeder::sOdometer = 0;
std::int32_t PollingFeeder::sObjectCount = 0;

bool PollingFeeder::supportsURL(const URL* url) {
    return url && (isHTTP(*url) || url->isScheme("file"));
}

PollingFeeder::PollingFeeder(const Ref<FeedCore>& feed) : Feeder(feed), mSerial(++sOdometer) {
    ++sObjectCount;
}

PollingFeeder::~PollingFeeder() {
    PollingFeeder::removed();
    gLogFeed.log("PollingFeeder %d destroyed, %d remain", mSerial, --sObjectCount);
}

void PollingFeeder::removed() {
    clearRequest();
    mIsParseDue = false;
    Feeder::removed();
}

bool PollingFeeder::needsRefresh() const {
    if (!mFeed) return false;
    const Date* last = mFeed->mRefreshLocalDate.getValue();
    if (!last || Foundation::ClockTrust::isFromWrongClock(last)) return true;
    const double interval = mFeed->getRefreshInterval();
    const double ago = last->getTimeAgo();
    return ago >= (interval == FeedCore::kRefreshNever ? kUnscheduledInterval : interval);
}

bool PollingFeeder::doRefresh() {
    mFetchAnnounced = false;
    startRequest(mFeed->mRedirectedURL.getValue());
    return mStatus.code == 0;
}

void PollingFeeder::cancelRefresh() {
    clearRequest();
    if (!mIsParseDue) return;
    // What has come is dropped, and has to come again.
    mIsParseDue = false;
    if (mFeed && mBefore) mFeed->setReadState(*mBefore);
    mBefore.reset();
}

void PollingFeeder::startRequest(URL* url) {
    if (!url) url = mURL;
    OV_ASSERT_AS(!mRequest.get(), "!mRequest");
    gLogFeed.log("Fetching from <%@> [last refreshed %@]", url,
                 mFeed->mRefreshLocalDate.getValue());
    if (url && isHTTP(*url)) {
        if (!askForPassword(url)) openRequest(url);
    } else if (url && url->isScheme("file")) {
        callAfterDelay<PollingFeeder>(0.0, this, &PollingFeeder::_fetchFromFile);
        mIsParseDue = true;
        mFeed->mRefreshLocalDate.setValue(Date::now());
    } else {
        // The two blanks are part of the text.
        Foundation::gWarn.log("PollingFeeder: Can't  handle this URL scheme: <%@>", url);
        endedRefresh(NetError(NetError::kPFURL, -11));
    }
}

/// Whether the request has to wait for a password.
bool PollingFeeder::askForPassword(URL* url) {
    String* login = mFeed->mLogin.getValue();
    if (!login || mFeed->getPassword()) return false;
    CredentialStore* store = CredentialStore::current();
    if (!store) return false;
    store->findInternetPassword(
        mURL, login,
        [self = Ref<PollingFeeder>(this), asked = Ref<URL>(url),
         lookUp = ++mLookUp](String* password) { self->gotPassword(lookUp, asked, password); });
    return true;
}

void PollingFeeder::gotPassword(std::uint32_t lookUp, URL* url, String* password) {
    if (lookUp != mLookUp || !mFeed) return;
    if (password) mFeed->setPassword(password, false);
    mHasStoredPassword = password != nullptr;
    openRequest(url);
}

void PollingFeeder::openRequest(URL* url) {
    const Ref<String> method = String::string("GET");
    mRequest = Foundation::Returner<HTTPRequest>::adopted(new HTTPRequest(url, method));
    if (!mForce) {
        mRequest->makeConditional(mFeed->mRefreshHTTPDate.getValue(),
                                  mFeed->mRefreshETag.getValue());
    }
    String* login = mFeed->mLogin.getValue();
    if (login) mRequest->setStoredCredential(login, mFeed->getPassword(), mURL);
    const auto bind = [this](ActionOf<URLRequest>& action,
                             void (PollingFeeder::*handler)(URLRequest*)) {
        action.setReceiver(receiver<URLRequest>(this, handler));
    };
    bind(mRequest->mOpened, &PollingFeeder::openedConnection);
    bind(mRequest->mGotResponse, &PollingFeeder::gotStatus);
    bind(mRequest->mFinished, &PollingFeeder::finished);
    bind(mRequest->mFailed, &PollingFeeder::gotError);
    mRequest->start(!mQueued);
}

void PollingFeeder::clearRequest() {
    ++mLookUp;
    if (!mRequest.get()) return;
    for (ActionOf<URLRequest>* action :
         {&mRequest->mGotResponse, &mRequest->mFinished, &mRequest->mFailed}) {
        action->setReceiver(nullptr);
    }
    mRequest->stop();
    mRequest = nullptr;
}

void PollingFeeder::openedConnection(URLRequest* request) {
    gLogFeed.log("Beginning HTTP fetch of <%@>", request->getURL());
    if (mFetchAnnounced) return;
    mFetchAnnounced = true;
    mFetchStarted.invoke(this);
}

void PollingFeeder::gotStatus(URLRequest* request) {
    const Ref<PollingFeeder> alive(this);
    const HTTPMessage* response = mRequest->getHTTPResponse();
    const int status = response ? response->getStatus() : 0;
    gLogFeed.log("Got status %u for %@", static_cast<unsigned>(status), mFeed);
    mFeed->mRefreshLocalDate.setValue(Date::now());
    if (status > 399) {
        mProtectionSpace = request->getProtectionSpace();
        gotError(NetError(NetError::kHTTP, status));
    } else if (status >= 300) {
        if (status != kNotModified) {
            Foundation::gWarn.log("PollingFeeder: unexpected status %i from <%@>", status,
                                  request->getURL());
        }
        clearRequest();
        endedRefresh(false);
    }
}

void PollingFeeder::finished(URLRequest* request) {
    const Ref<PollingFeeder> alive(this);
    mData = request->getResponseData();
    mFinalURL = mRequest->getFinalURL();
    mFinalPermanentURL = mRequest->getFinalPermanentURL();
    mBefore = mFeed->getReadState();
    const HTTPMessage* response = mRequest->getHTTPResponse();
    const Ref<String> lastModified = headerOf(response, "Last-Modified");
    const Ref<String> eTag = headerOf(response, "ETag");
    mFeed->mRefreshHTTPDate.setValue(lastModified);
    mFeed->mRefreshETag.setValue(eTag);
    mFeed->mLogin.setValue(request->getUsername());
    clearRequest();
    gLogFeed.log("Got contents (%u bytes) of %@", lengthOf(mData), mFeed);
    mIsParseDue = true;
    // Not inside of what the network called.
    callAfterDelay<PollingFeeder>(0.0, this, &PollingFeeder::parseFeed);
}

void PollingFeeder::gotError(URLRequest* request) {
    const Ref<PollingFeeder> alive(this);
    gLogFeed.log("Got network error for %@", mFeed);
    gotError(request->getError());
}

void PollingFeeder::gotError(NetError error) {
    mFeed->mRefreshLocalDate.setValue(Date::now());
    if (mHasStoredPassword) {
        // It is looked for anew the next time: it may have been changed.
        mHasStoredPassword = false;
        mFeed->setPassword(nullptr, false);
    }
    const bool wasRedirected = mRequest.get() && !IsEqual(mRequest->getURL(), mURL.get());
    clearRequest();
    if (wasRedirected) {
        startRequest(mURL);
    } else {
        endedRefresh(error);
    }
}

void PollingFeeder::_fetchFromFile() {
    if (!mIsParseDue) return;
    gLogFeed.log("Reading contents of <%@>", mURL);
    NetError error;
    mData = Data::dataFromResource(mURL, error);
    if (error.code != 0) {
        mIsParseDue = false;
        endedRefresh(error);
        return;
    }
    mFinalURL = mURL;
    mFinalPermanentURL = mURL;
    gLogFeed.log("Got contents (%u bytes) of %@", lengthOf(mData), mFeed);
    parseFeed();
}

}  // namespace Orvane
