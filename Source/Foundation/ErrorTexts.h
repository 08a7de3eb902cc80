#pragma once

#include <string>

namespace Foundation {

/// The text for a code of `OVURLErrorDomain`, in the language of the process; empty if there is
/// none. The two codes of authentication have none: their text is that of a key which translators
/// know.
std::string describeURLError(int code);

}  // namespace Foundation
