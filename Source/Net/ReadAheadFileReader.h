#pragma once

#include "Foundation/UniqueFD.h"
#include "Model/FileReader.h"

namespace Orvane {

/// Reads a local file in one go. The kernel fetches it from the disk while the caller does
/// something else: no thread of ours is needed for that.
class ReadAheadFileReader : public FileReader {
 public:
    /// The file is opened now, and what it holds by the time of `finish` is read. `readsAhead` lets
    /// the kernel begin. `url` may be of no file, which then cannot be read.
    ReadAheadFileReader(Foundation::URL* url, bool readsAhead);

    /// Null for what is no plain file, too.
    Foundation::DataReturner finish() override;

 private:
    Foundation::UniqueFD mFile;
};

}  // namespace Orvane
