#include "Net/ResponseCache.h"

#include "Foundation/AtomicFile.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>
#include <system_error>
#include <vector>

namespace Orvane {

namespace fs = std::filesystem;

using Foundation::Data;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

namespace {

// A file: this line, the URL, the end of the lifetime, the status, the headers, an empty line, and
// the body.
constexpr const char* kFirstLine = "Orvane response 1";

double now() {
    return Foundation::Clock::current().now();
}

std::string textOf(const Foundation::URL& url) {
    const Ref<String> text = url.getAbsoluteString();
    return text->utf8();
}

/// The end of the lifetime of the response in a file; 0 for a file that is none.
double expirationOf(const fs::path& path) {
    std::ifstream file(path);
    std::string first;
    std::string url;
    double expiration = 0;
    if (!std::getline(file, first) || first != kFirstLine) return 0;
    if (!std::getline(file, url) || !(file >> expiration)) return 0;
    return expiration;
}

std::vector<HTTPHeader> readHeaders(std::istream& file) {
    std::vector<HTTPHeader> headers;
    for (std::string line; std::getline(file, line) && !line.empty();) {
        const std::size_t colon = line.find(": ");
        if (colon != std::string::npos) {
            headers.push_back({line.substr(0, colon), line.substr(colon + 2)});
        }
    }
    return headers;
}

}  // namespace

bool ResponseCache::mayAnswer(const ConnectionRequest& request) {
    const HTTPMessage& message = request.message();
    constexpr const char* kConditions[] = {"If-None-Match", "If-Modified-Since", "If-Match",
                                           "If-Unmodified-Since", "Range"};
    return request.getCachePolicy() != CachePolicy::Reload && message.getMethod() == "GET" &&
           std::ranges::none_of(kConditions,
                                [&](const char* name) { return message.hasHeader(name); });
}

std::string ResponseCache::pathFor(const std::string& url) const {
    const Ref<Data> bytes = Data::adopt(url);
    const Ref<String> hash = bytes->SHA1HashString();
    return mDirectory + "/" + hash->utf8();
}

void ResponseCache::add(CachedResponse* response, const ConnectionRequest* request) {
    const std::string url = textOf(*request->getURL());
    mInMemory.erase(url);
    const bool isForDisk =
        response->getStoragePolicy() == StoragePolicy::Allowed && !mDirectory.empty();
    if (isForDisk) {
        writeFile(*response, url);
    } else if (response->getStoragePolicy() != StoragePolicy::NotAllowed) {
        mInMemory.emplace(url, response);
        pruneMemory();
    }
}

Returner<CachedResponse> ResponseCache::find(const ConnectionRequest* request) {
    if (!mayAnswer(*request)) return {};
    const auto found = mInMemory.find(textOf(*request->getURL()));
    Ref<CachedResponse> response =
        found != mInMemory.end() ? found->second : Ref<CachedResponse>(readFile(*request));
    if (!response) return {};
    const bool isFresh = response->getResponse()->getExpirationTime() > now();
    if (!isFresh && request->getCachePolicy() != CachePolicy::CacheElseLoad) return {};
    return response;
}

Returner<CachedResponse> ResponseCache::readFile(const ConnectionRequest& request) const {
    if (mDirectory.empty()) return {};
    const std::string url = textOf(*request.getURL());
    std::ifstream file(pathFor(url), std::ios::binary);
    std::string first;
    std::string itsURL;
    double expiration = 0;
    int status = 0;
    if (!std::getline(file, first) || first != kFirstLine) return {};
    if (!std::getline(file, itsURL) || itsURL != url) return {};
    if (!(file >> expiration >> status) || file.get() != '\n') return {};
    const Ref<HTTPMessage> message = HTTPMessage::response(status, readHeaders(file));
    if (!file) return {};
    std::string body((std::istreambuf_iterator<char>(file)), {});
    const Ref<Data> data = Data::adopt(std::move(body));
    const Ref<ConnectionResponse> response =
        ConnectionResponse::response(&request.message(), message, now());
    response->setExpirationTime(expiration);
    return CachedResponse::cachedResponse(response, data, StoragePolicy::Allowed);
}

void ResponseCache::writeFile(const CachedResponse& response, const std::string& url) {
    const HTTPMessage& message = *response.getResponse()->getHTTPMessage();
    std::string content =
        OVFormat("%s\n%s\n%.3f\n%d\n", kFirstLine, url, response.getResponse()->getExpirationTime(),
                 message.getStatus());
    for (const HTTPHeader& header : message.headers()) {
        content += header.name + ": " + header.value + "\n";
    }
    content += "\n";
    content += response.getData()->view();
    std::error_code failure;
    fs::create_directories(mDirectory, failure);
    const int error = Foundation::AtomicFile::write(pathFor(url), content);
    if (error != 0) {
        Foundation::gWarn.log("Can't write to \"%s\": %s", mDirectory, std::strerror(error));
    }
    pruneDirectory();
}

void ResponseCache::pruneMemory() {
    std::erase_if(mInMemory, [](const auto& entry) {
        return entry.second->getResponse()->getExpirationTime() <= now();
    });
    const auto bytes = [this] {
        std::size_t sum = 0;
        for (const auto& [url, response] : mInMemory) {
            sum += response->getData()->getLength();
        }
        return sum;
    };
    while (!mInMemory.empty() && (mInMemory.size() > kMaxResponses || bytes() > kMaxBytes)) {
        mInMemory.erase(std::ranges::min_element(mInMemory, {}, [](const auto& entry) {
            return entry.second->getResponse()->getExpirationTime();
        }));
    }
}

void ResponseCache::pruneDirectory() const {
    struct File {
        fs::path path;
        std::size_t size;
        double expiration = 0;
    };
    std::vector<File> files;
    std::size_t bytes = 0;
    std::error_code failure;
    for (const auto& entry : fs::directory_iterator(mDirectory, failure)) {
        const auto size = static_cast<std::size_t>(entry.file_size(failure));
        files.push_back({entry.path(), size});
        bytes += size;
    }
    std::size_t count = files.size();
    const auto isTooMuch = [&] { return count > kMaxResponses || bytes > kMaxBytes; };
    if (!isTooMuch()) return;
    for (File& file : files) {
        file.expiration = expirationOf(file.path);
    }
    std::ranges::sort(files, {}, &File::expiration);
    for (const File& file : files) {
        if (!isTooMuch() && file.expiration > now()) break;
        fs::remove(file.path, failure);
        --count;
        bytes -= file.size;
    }
}

}  // namespace Orvane
