#pragma once

#include "Foundation/Ref.h"
#include "Net/CachedResponse.h"
#include "Net/ConnectionRequest.h"

#include <map>
#include <string>

namespace Orvane {

/// Responses that may be used again without asking: a file each in a directory, or in memory what
/// may not be on a disk. It holds what is added to it, and nothing by itself.
class ResponseCache : Foundation::Uncopyable {
 public:
    // Beyond these, those whose time ends first are dropped.
    static constexpr std::size_t kMaxResponses = 64;
    static constexpr std::size_t kMaxBytes = std::size_t{16} << 20;

    /// An empty path keeps all in memory.
    explicit ResponseCache(std::string directory) : mDirectory(std::move(directory)) {}

    /// Keeps a response as the answer to a request, in the place of any other. What cannot be
    /// written is warned of.
    void add(CachedResponse* response, const ConnectionRequest* request);
    /// What answers a request by the policy of that; null if it has to be sent. Only a GET that is
    /// under no condition is ever answered.
    Foundation::Returner<CachedResponse> find(const ConnectionRequest* request);

 private:
    static bool mayAnswer(const ConnectionRequest& request);
    std::string pathFor(const std::string& url) const;
    Foundation::Returner<CachedResponse> readFile(const ConnectionRequest& request) const;
    void writeFile(const CachedResponse& response, const std::string& url);
    void pruneMemory();
    void pruneDirectory() const;

    const std::string mDirectory;
    std::map<std::string, Foundation::Ref<CachedResponse>> mInMemory;  ///< by URL
};

}  // namespace Orvane
