#include "Net/CurlErrors.h"

#include <Orvane/OVErrorCode.h>
#include <curl/curl.h>

#include <cerrno>
#include <utility>

namespace Orvane {

namespace {

bool isWithoutNetwork(long osError) {
    return osError == ENETUNREACH || osError == ENETDOWN || osError == EADDRNOTAVAIL;
}

int urlErrorOf(int result, long osError) {
    switch (result) {
        case CURLE_COULDNT_RESOLVE_PROXY:
        case CURLE_COULDNT_RESOLVE_HOST:
            return OVURLErrorCannotFindHost;
        case CURLE_COULDNT_CONNECT:
        case CURLE_INTERFACE_FAILED:
        case CURLE_PROXY:
            return isWithoutNetwork(osError) ? OVURLErrorNotConnected
                                             : OVURLErrorCannotConnectToHost;
        case CURLE_PARTIAL_FILE:
        case CURLE_SEND_ERROR:
        case CURLE_RECV_ERROR:
        case CURLE_GOT_NOTHING:
        case CURLE_HTTP2:
        case CURLE_HTTP2_STREAM:
        case CURLE_SEND_FAIL_REWIND:
            return OVURLErrorNetworkConnectionLost;
        case CURLE_OPERATION_TIMEDOUT:
            return OVURLErrorTimedOut;
        case CURLE_URL_MALFORMAT:
            return OVURLErrorBadURL;
        case CURLE_UNSUPPORTED_PROTOCOL:
            return OVURLErrorUnsupportedURL;
        case CURLE_SSL_CONNECT_ERROR:
        case CURLE_SSL_CERTPROBLEM:
        case CURLE_SSL_CIPHER:
        case CURLE_PEER_FAILED_VERIFICATION:
        case CURLE_SSL_CACERT_BADFILE:
        case CURLE_SSL_ISSUER_ERROR:
        case CURLE_SSL_PINNEDPUBKEYNOTMATCH:
        case CURLE_SSL_INVALIDCERTSTATUS:
        case CURLE_SSL_CLIENTCERT:
        case CURLE_SSL_ENGINE_INITFAILED:
        case CURLE_USE_SSL_FAILED:
            return OVURLErrorSecureConnectionFailed;
        case CURLE_TOO_MANY_REDIRECTS:
            return OVURLErrorTooManyRedirects;
        case CURLE_WEIRD_SERVER_REPLY:
        case CURLE_BAD_CONTENT_ENCODING:
        case CURLE_BAD_DOWNLOAD_RESUME:
        case CURLE_RANGE_ERROR:
            return OVURLErrorBadServerResponse;
        default:
            return OVURLErrorUnknown;
    }
}

}  // namespace

Foundation::Returner<ConnectionError> connectionErrorOf(int result, long osError,
                                                        std::string text) {
    if (result == CURLE_OUT_OF_MEMORY) {
        return ConnectionError::error(ConnectionError::kPOSIXDomain, ENOMEM, std::move(text));
    }
    return ConnectionError::error(ConnectionError::kNetworkDomain, urlErrorOf(result, osError),
                                  std::move(text));
}

}  // namespace Orvane
