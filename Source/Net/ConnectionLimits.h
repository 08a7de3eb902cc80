#pragma once

#include <cstddef>

namespace Orvane {

/// What a server may do to us. Each is logged when it is hit, and ends the request with an error.
namespace ConnectionLimits {

inline constexpr std::size_t kMaxDocumentBytes = std::size_t{32} << 20;  ///< of a decoded body
/// A body of more than `kFreeDecodedBytes` may be this many times larger than what was sent.
inline constexpr std::size_t kMaxDecodedRatio = 200;
inline constexpr std::size_t kFreeDecodedBytes = std::size_t{1} << 20;
inline constexpr int kMaxRedirects = 20;
inline constexpr std::size_t kMaxHeaderBytes = std::size_t{256} << 10;  ///< of one response
inline constexpr double kMaxDocumentSeconds = 300.0;  ///< with the wait for the host
inline constexpr unsigned kMaxConnectionsPerHost = 6;
/// Of a body that nobody wants, such as a redirect's, as much is read to keep the connection.
inline constexpr std::size_t kMaxIgnoredBytes = std::size_t{64} << 10;
/// Codings of a body one over the other.
inline constexpr std::size_t kMaxContentCodings = 3;

}  // namespace ConnectionLimits
}  // namespace Orvane
