#pragma once

#include "Foundation/RefCounted.h"

namespace Orvane {

/// What an enclosure knows of its downloader, which fetches its file, and writes into its columns
/// how that goes. Dropped while it runs, it leaves nothing of the file.
class Downloader : public Foundation::RefCounted {
 public:
    /// Does nothing if it runs.
    virtual void start() = 0;
    /// Stops, and keeps what there is of the file if it can be resumed.
    virtual void interrupt() = 0;
    /// How many bytes of the file there are.
    virtual long long getDownloadedBytes() const = 0;
};

}  // namespace Orvane
