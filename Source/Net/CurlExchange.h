#pragma once

#include "Net/Transport.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

typedef void CURL;
struct curl_slist;

namespace Orvane {

class CurlTransport;

/// One transfer of libcurl. What comes out of libcurl's callbacks, inside which it may not be
/// called, is kept until `flush` hands it on.
class CurlExchange : public Exchange {
 public:
    struct EasyDeleter {
        void operator()(CURL* easy) const;
    };
    using Easy = std::unique_ptr<CURL, EasyDeleter>;

    /// `easy` is null or a handle that made the same request before.
    CurlExchange(CurlTransport& transport, const ExchangeRequest& request, ExchangeClient& client,
                 Easy easy);
    ~CurlExchange() override;

    CURL* getEasy() const { return mEasy.get(); }
    /// Gives up the handle of an exchange that has ended, with what it knows of the server's wish
    /// for a login.
    Easy detachEasy();

    /// The transfer has ended with a code of libcurl, 0 for success.
    void finish(int result);
    /// Whether there is anything to hand on.
    bool hasNews() const;
    /// Hands on what has come. The client may destroy the exchange. What the client throws is
    /// reported, and ends the transfer with a failure.
    void flush();

 private:
    class FlushMark;
    struct ListDeleter {
        void operator()(curl_slist* list) const;
    };

    void setUp(const ExchangeRequest& request);
    void setUpMethod();
    void setUpHeaders(const ExchangeRequest& request);
    void setUpLogin(const ExchangeRequest& request);
    void setUpCookies(const ExchangeRequest& request);
    void setUpSecurity();

    static std::size_t headerCallback(char* data, std::size_t size, std::size_t count, void* self);
    static std::size_t bodyCallback(char* data, std::size_t size, std::size_t count, void* self);
    static std::size_t readCallback(char* buffer, std::size_t size, std::size_t count, void* self);
    static int seekCallback(void* self, long offset, int origin);
    bool takeHeader(std::string_view line);
    void takeStatusLine(std::string_view line);
    bool takeHeadEnd();
    bool isRefused() const;
    void handOn();
    void giveUp();
    void handOnBody();
    std::vector<std::string> currentCookies() const;
    ExchangeEnd endFor(int result) const;

    CurlTransport& mTransport;
    ExchangeClient& mClient;
    const bool mIsRepeated;  ///< with a login for the demand that the handle has seen
    Easy mEasy;
    Foundation::Ref<HTTPMessage> mMessage;
    std::unique_ptr<curl_slist, ListDeleter> mHeaderList;
    std::size_t mUploaded = 0;
    bool mHandlesCookies = false;
    bool mHasLogin = false;
    std::string mErrorText;  ///< a buffer that libcurl writes
    std::shared_ptr<int> mLife = std::make_shared<int>();
    bool mIsRunning = false;  ///< known to the transport
    bool mIsFlushing = false;

    // What has come and not been handed on.
    ExchangeHead mHead;
    std::size_t mHeaderBytes = 0;
    bool mHeadIsWhole = false;
    bool mHeadIsFinal = false;  ///< libcurl will not try again by itself
    bool mHeadIsSent = false;
    bool mHeadIsTooLong = false;
    bool mIsCutShort = false;  ///< behind the head, which was all that was wanted
    bool mHasMoved = false;
    std::string mBody;
    std::optional<int> mResult;
};

}  // namespace Orvane
