#include "Foundation/ErrorTexts.h"

#include "Foundation/Bundle.h"

#include <Orvane/OVErrorCode.h>

namespace Foundation {

namespace {

struct URLErrorText {
    int code;
    const char* text;
};

constexpr URLErrorText kURLErrorTexts[] = {
    {OVURLErrorUnknown, "An unknown error happened while loading."},
    {OVURLErrorCancelled, "Loading was cancelled."},
    {OVURLErrorBadURL, "The address is not valid."},
    {OVURLErrorTimedOut, "The server took too long to answer."},
    {OVURLErrorUnsupportedURL, "Addresses of this kind are not supported."},
    {OVURLErrorCannotFindHost, "The server could not be found."},
    {OVURLErrorCannotConnectToHost, "The server could not be reached."},
    {OVURLErrorNetworkConnectionLost, "The network connection was lost."},
    {OVURLErrorDNSLookupFailed, "The server's name could not be looked up."},
    {OVURLErrorTooManyRedirects, "The server redirects too often."},
    {OVURLErrorResourceUnavailable, "The document is not available."},
    {OVURLErrorNotConnected, "There is no connection to the network."},
    {OVURLErrorBadRedirect, "The server redirects to a place that does not exist."},
    {OVURLErrorBadServerResponse, "The server gave an answer that makes no sense."},
    {OVURLErrorFileDoesNotExist, "The document does not exist."},
    {OVURLErrorFileIsDirectory, "The document is a folder."},
    {OVURLErrorNoPermission, "The document may not be read."},
    {OVURLErrorSecureConnectionFailed, "A secure connection could not be made."},
    {OVURLErrorCannotWriteFile, "The file could not be written."},
};

}  // namespace

std::string describeURLError(int code) {
    for (const URLErrorText& entry : kURLErrorTexts) {
        if (entry.code == code) return localizedText(entry.text);
    }
    return {};
}

}  // namespace Foundation
