#include "Net/CurlExchange.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Net/BodyDecoder.h"
#include "Net/ConnectionLimits.h"
#include "Net/CurlErrors.h"
#include "Net/CurlTransport.h"
#include "Net/WWWAuthenticate.h"

#include <curl/curl.h>
#include <sys/socket.h>

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <cstring>
#include <utility>

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;

static_assert(std::is_same_v<curl_off_t, long>);

namespace {

/// Longer than ours, which decides.
constexpr long kNoConnectTimeoutSeconds = 86400;
/// Four times what libcurl reads at once by itself: a document comes in a few pieces.
constexpr long kBufferBytes = 64L << 10;
/// Room that is kept for what comes next.
constexpr std::size_t kMaxKeptBytes = std::size_t{1} << 20;

/// A result beside libcurl's own: the client has failed.
constexpr int kNotTaken = -1;

template <class Value>
void set(CURL* easy, CURLoption option, Value value) {
    const CURLcode result = curl_easy_setopt(easy, option, value);
    OV_ASSERT_MESSAGE(result == CURLE_OK, "libcurl: option %d: %s", static_cast<int>(option),
                      curl_easy_strerror(result));
}

/// libcurl's own sockets would be handed on to the processes that this one starts.
curl_socket_t openSocket(void*, curlsocktype, curl_sockaddr* address) {
    const int fd = ::socket(address->family, address->socktype | SOCK_CLOEXEC, address->protocol);
    return fd < 0 ? CURL_SOCKET_BAD : fd;
}

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view kBlanks = " \t\r\n";
    const std::size_t begin = text.find_first_not_of(kBlanks);
    if (begin == std::string_view::npos) return {};
    return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

const char* environment(const char* name) {
    const char* value = std::getenv(name);
    return value && *value ? value : nullptr;
}

}  // namespace

/// Says that the exchange hands on what it has, while that goes on and the exchange lives.
class CurlExchange::FlushMark : Foundation::Uncopyable {
 public:
    explicit FlushMark(CurlExchange& exchange) : mExchange(exchange), mLife(exchange.mLife) {
        mExchange.mIsFlushing = true;
    }
    ~FlushMark() {
        if (isAlive()) mExchange.mIsFlushing = false;
    }
    bool isAlive() const { return !mLife.expired(); }

 private:
    CurlExchange& mExchange;
    const std::weak_ptr<int> mLife;
};

void CurlExchange::EasyDeleter::operator()(CURL* easy) const {
    curl_easy_cleanup(easy);
}

void CurlExchange::ListDeleter::operator()(curl_slist* list) const {
    curl_slist_free_all(list);
}

CurlExchange::CurlExchange(CurlTransport& transport, const ExchangeRequest& request,
                           ExchangeClient& client, Easy easy)
    : mTransport(transport),
      mClient(client),
      mIsRepeated(easy != nullptr),
      mEasy(easy ? std::move(easy) : Easy(curl_easy_init())),
      mMessage(request.message),
      mErrorText(CURL_ERROR_SIZE, '\0') {
    OV_ASSERT(mEasy);
    setUp(request);
    mIsRunning = true;
    mTransport.add(*this);
}

CurlExchange::~CurlExchange() {
    if (mIsRunning) mTransport.remove(*this);
    // It may outlive this for what other connections are made of.
    if (mEasy) curl_easy_setopt(mEasy.get(), CURLOPT_ERRORBUFFER, nullptr);
}

CurlExchange::Easy CurlExchange::detachEasy() {
    if (std::exchange(mIsRunning, false)) mTransport.remove(*this);
    return std::move(mEasy);
}

void CurlExchange::setUp(const ExchangeRequest& request) {
    CURL* easy = mEasy.get();
    const Ref<Foundation::URL> plain = mMessage->getURL()->getURLWithoutUser();
    const Ref<String> url = plain->getAbsoluteString();
    set(easy, CURLOPT_URL, url->utf8().c_str());
    set(easy, CURLOPT_PRIVATE, this);
    set(easy, CURLOPT_ERRORBUFFER, mErrorText.data());
    set(easy, CURLOPT_NOSIGNAL, 1L);
    set(easy, CURLOPT_OPENSOCKETFUNCTION, &openSocket);
    set(easy, CURLOPT_CONNECTTIMEOUT, kNoConnectTimeoutSeconds);
    // A name server that does not answer must not keep the loop waiting for a transfer's end.
    set(easy, CURLOPT_QUICK_EXIT, 1L);
    set(easy, CURLOPT_BUFFERSIZE, kBufferBytes);
    set(easy, CURLOPT_FOLLOWLOCATION, 0L);
    set(easy, CURLOPT_HTTP_CONTENT_DECODING, 0L);
    set(easy, CURLOPT_SUPPRESS_CONNECT_HEADERS, 1L);
    set(easy, CURLOPT_HEADERFUNCTION, &CurlExchange::headerCallback);
    set(easy, CURLOPT_HEADERDATA, this);
    set(easy, CURLOPT_WRITEFUNCTION, &CurlExchange::bodyCallback);
    set(easy, CURLOPT_WRITEDATA, this);
    setUpSecurity();
    setUpMethod();
    setUpHeaders(request);
    setUpLogin(request);
    setUpCookies(request);
}

void CurlExchange::setUpSecurity() {
    CURL* easy = mEasy.get();
    set(easy, CURLOPT_PROTOCOLS_STR, "http,https");
    set(easy, CURLOPT_SSL_VERIFYPEER, 1L);
    set(easy, CURLOPT_SSL_VERIFYHOST, 2L);
    if (const char* file = environment("SSL_CERT_FILE")) set(easy, CURLOPT_CAINFO, file);
    if (const char* folder = environment("SSL_CERT_DIR")) set(easy, CURLOPT_CAPATH, folder);
}

void CurlExchange::setUpMethod() {
    CURL* easy = mEasy.get();
    const std::string& method = mMessage->getMethod();
    if (const Foundation::Data* body = mMessage->getBody()) {
        set(easy, CURLOPT_UPLOAD, 1L);
        set(easy, CURLOPT_CUSTOMREQUEST, method.c_str());
        set(easy, CURLOPT_INFILESIZE_LARGE, static_cast<curl_off_t>(body->getLength()));
        set(easy, CURLOPT_READFUNCTION, &CurlExchange::readCallback);
        set(easy, CURLOPT_READDATA, this);
        set(easy, CURLOPT_SEEKFUNCTION, &CurlExchange::seekCallback);
        set(easy, CURLOPT_SEEKDATA, this);
    } else if (method == "HEAD") {
        set(easy, CURLOPT_NOBODY, 1L);
    } else {
        set(easy, CURLOPT_HTTPGET, 1L);
        if (method != "GET") set(easy, CURLOPT_CUSTOMREQUEST, method.c_str());
    }
}

void CurlExchange::setUpHeaders(const ExchangeRequest& request) {
    const auto add = [this](const std::string& line) {
        curl_slist* list = curl_slist_append(mHeaderList.get(), line.c_str());
        if (!list) throw std::bad_alloc();
        static_cast<void>(mHeaderList.release());
        mHeaderList.reset(list);
    };
    for (const HTTPHeader& header : mMessage->headers()) {
        // libcurl's own form of a header that is there and empty.
        add(header.value.empty() ? header.name + ";" : header.name + ": " + header.value);
    }
    // Not to wait for servers that never say "100 Continue".
    if (mMessage->getBody()) add("Expect:");
    if (request.acceptsCodings && !mMessage->hasHeader("Accept-Encoding")) {
        add(std::string("Accept-Encoding: ") + BodyDecoder::kAcceptedCodings);
    }
    set(mEasy.get(), CURLOPT_HTTPHEADER, mHeaderList.get());
}

void CurlExchange::setUpLogin(const ExchangeRequest& request) {
    CURL* easy = mEasy.get();
    mHasLogin = request.credential.get() != nullptr;
    if (!mHasLogin) return;
    const bool isDigest = request.method == AuthenticationMethod::Digest;
    set(easy, CURLOPT_HTTPAUTH, isDigest ? CURLAUTH_DIGEST : CURLAUTH_BASIC);
    const std::string user(String::view(request.credential->getUser()));
    const std::string password(String::view(request.credential->getPassword()));
    set(easy, CURLOPT_USERNAME, user.c_str());
    set(easy, CURLOPT_PASSWORD, password.c_str());
}

void CurlExchange::setUpCookies(const ExchangeRequest& request) {
    mHandlesCookies = request.handlesCookies;
    if (!mHandlesCookies) return;
    CURL* easy = mEasy.get();
    set(easy, CURLOPT_COOKIEFILE, "");
    set(easy, CURLOPT_COOKIELIST, "ALL");  // takes all away
    for (const std::string& line : request.cookies) {
        set(easy, CURLOPT_COOKIELIST, line.c_str());
    }
}

std::size_t CurlExchange::headerCallback(char* data, std::size_t size, std::size_t count,
                                         void* self) {
    auto& exchange = *static_cast<CurlExchange*>(self);
    bool goesOn = false;
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
        goesOn = exchange.takeHeader(std::string_view(data, size * count));
    });
    // Any other number than the given one makes libcurl give up.
    return goesOn ? size * count : 0;
}

bool CurlExchange::takeHeader(std::string_view line) {
    mHasMoved = true;
    if (mHeadIsSent || !mBody.empty()) return true;  // trailers, which say nothing that counts
    mHeaderBytes += line.size();
    if (mHeaderBytes > ConnectionLimits::kMaxHeaderBytes) {
        mHeadIsTooLong = true;
        return false;
    }
    const std::string_view text = trimmed(line);
    if (mHead.status == 0 || mHeadIsWhole) {
        takeStatusLine(text);
    } else if (text.empty()) {
        return takeHeadEnd();
    } else if (line.front() == ' ' || line.front() == '\t') {
        // A line that goes on: RFC 9112, 5.2.
        if (!mHead.headers.empty()) mHead.headers.back().value.append(" ").append(text);
    } else if (const std::size_t colon = text.find(':'); colon != std::string_view::npos) {
        mHead.headers.push_back({std::string(trimmed(text.substr(0, colon))),
                                 std::string(trimmed(text.substr(colon + 1)))});
    }
    return true;
}

void CurlExchange::takeStatusLine(std::string_view line) {
    // Provisional responses count with the one that they announce.
    if (mHead.status >= 200) mHeaderBytes = line.size();
    mHead = {};
    mHeadIsWhole = mHeadIsFinal = false;
    const std::size_t blank = std::min(line.find(' '), line.size());
    const std::string_view rest = trimmed(line.substr(blank));
    std::from_chars(rest.data(), rest.data() + rest.size(), mHead.status);
}

/// False to end the transfer here.
bool CurlExchange::takeHeadEnd() {
    mHeadIsWhole = true;
    mIsCutShort = mIsRepeated && isRefused();
    // Of a login that was refused libcurl tells by what it does next.
    mHeadIsFinal = mIsCutShort || (mHead.status >= 200 && !(mHead.status == 401 && mHasLogin));
    return !mIsCutShort;
}

/// Whether the login was not good. libcurl would try it once more where the first demand came to
/// another transfer of the handle, and servers count failures.
bool CurlExchange::isRefused() const {
    if (mHead.status != 401) return false;
    const Ref<HTTPMessage> response = HTTPMessage::response(mHead.status, mHead.headers);
    const WWWAuthenticate asked(response->getHeader("WWW-Authenticate"));
    const WWWAuthenticate::Challenge* digest = asked.find("Digest");
    return !digest || !HTTPMessage::isSameName(digest->getParameter("stale"), "true");
}

std::size_t CurlExchange::bodyCallback(char* data, std::size_t size, std::size_t count,
                                       void* self) {
    auto& exchange = *static_cast<CurlExchange*>(self);
    bool goesOn = false;
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
        exchange.mHeadIsFinal = exchange.mHeadIsWhole;
        exchange.mBody.append(data, size * count);
        goesOn = true;
    });
    return goesOn ? size * count : 0;
}

std::size_t CurlExchange::readCallback(char* buffer, std::size_t size, std::size_t count,
                                       void* self) {
    auto& exchange = *static_cast<CurlExchange*>(self);
    const std::string_view body = exchange.mMessage->getBody()->view();
    const std::size_t length = std::min(size * count, body.size() - exchange.mUploaded);
    std::memcpy(buffer, body.data() + exchange.mUploaded, length);
    exchange.mUploaded += length;
    exchange.mHasMoved = true;
    return length;
}

int CurlExchange::seekCallback(void* self, long offset, int origin) {
    auto& exchange = *static_cast<CurlExchange*>(self);
    if (origin != SEEK_SET || offset < 0) return CURL_SEEKFUNC_CANTSEEK;
    const std::size_t length = exchange.mMessage->getBody()->getLength();
    exchange.mUploaded = std::min(static_cast<std::size_t>(offset), length);
    return CURL_SEEKFUNC_OK;
}

void CurlExchange::finish(int result) {
    mHeadIsFinal = mHeadIsWhole && mHead.status >= 200;
    mResult = mIsCutShort ? static_cast<int>(CURLE_OK) : result;
}

bool CurlExchange::hasNews() const {
    return mHasMoved || (mHeadIsFinal && !mHeadIsSent) || !mBody.empty() || mResult;
}

void CurlExchange::flush() {
    if (mIsFlushing) return;
    const FlushMark mark(*this);
    while (mark.isAlive() && hasNews()) {
        bool isTaken = false;
        Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
            handOn();
            isTaken = true;
        });
        if (!isTaken && mark.isAlive()) giveUp();
    }
}

/// The client has not taken what there was: what follows would be taken for the whole.
void CurlExchange::giveUp() {
    mHasMoved = false;
    mHeadIsSent = true;
    mBody.clear();
    if (mIsRunning) mResult = kNotTaken;
}

/// One piece of news.
void CurlExchange::handOn() {
    if (std::exchange(mHasMoved, false)) {
        mClient.moved();
    } else if (mHeadIsFinal && !mHeadIsSent) {
        mHeadIsSent = true;
        mHead.cookies = currentCookies();
        mClient.gotHead(std::exchange(mHead, {}));
    } else if (!mBody.empty()) {
        handOnBody();
    } else {
        const ExchangeEnd end = endFor(*std::exchange(mResult, {}));
        if (std::exchange(mIsRunning, false)) mTransport.remove(*this);
        mClient.ended(end);
    }
}

void CurlExchange::handOnBody() {
    const std::weak_ptr<int> life = mLife;
    std::string body = std::exchange(mBody, {});
    mClient.gotBody(body);
    if (life.expired() || !mBody.empty() || body.capacity() > kMaxKeptBytes) return;
    body.clear();
    mBody = std::move(body);
}

std::vector<std::string> CurlExchange::currentCookies() const {
    std::vector<std::string> lines;
    if (!mHandlesCookies) return lines;
    curl_slist* list = nullptr;
    if (curl_easy_getinfo(mEasy.get(), CURLINFO_COOKIELIST, &list) != CURLE_OK) return lines;
    const std::unique_ptr<curl_slist, ListDeleter> owner(list);
    for (const curl_slist* item = list; item; item = item->next) {
        lines.emplace_back(item->data);
    }
    return lines;
}

ExchangeEnd CurlExchange::endFor(int result) const {
    if (result == CURLE_OK) return {};
    if (result == kNotTaken) return {NetError(NetError::kOrvane, OVInternalError), nullptr};
    // libcurl takes a line that is longer than it likes (100 KiB) for a lack of memory.
    if (mHeadIsTooLong || (result == CURLE_OUT_OF_MEMORY && !mHeadIsWhole)) {
        Foundation::gWarn.log("<%s>: more than %zu bytes of headers, or too many in one",
                              mMessage->getPlace(), ConnectionLimits::kMaxHeaderBytes);
        return {NetError(NetError::kPFURL, OVURLErrorBadServerResponse), nullptr};
    }
    long osError = 0;
    curl_easy_getinfo(mEasy.get(), CURLINFO_OS_ERRNO, &osError);
    const auto code = static_cast<CURLcode>(result);
    const char* text = mErrorText.front() ? mErrorText.c_str() : curl_easy_strerror(code);
    return {NetError::None, connectionErrorOf(result, osError, text)};
}

}  // namespace Orvane
