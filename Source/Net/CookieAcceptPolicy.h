#pragma once

namespace Orvane {

/// Whose cookies are kept.
enum class CookieAcceptPolicy {
    Always = 0,
    Never = 1,                 ///< and none is sent
    OnlyFromMainDocument = 2,  ///< of the site that was asked, not of others that it leads to
};

}  // namespace Orvane
