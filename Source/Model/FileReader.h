#pragma once

#include "Foundation/Returner.h"
#include "Foundation/Uncopyable.h"

#include <memory>

namespace Orvane {

/// Reads a whole local file while its caller does something else.
class FileReader : Foundation::Uncopyable {
 public:
    using Maker = std::unique_ptr<FileReader> (*)(Foundation::URL* url);

    virtual ~FileReader() = default;
    /// Waits until the file is read. Its bytes; null where it cannot be read.
    virtual Foundation::DataReturner finish() = 0;

    /// Begins to read. Without a maker the file is read when it is waited for.
    static std::unique_ptr<FileReader> open(Foundation::URL* url);
    /// Who makes the readers of the process; null for none.
    static void setMaker(Maker maker);
};

}  // namespace Orvane
