#pragma once

#include "Foundation/Returner.h"

namespace Orvane {

class Downloader;
class EnclosureCore;

/// Who makes the downloaders of enclosures. Set once per process; null until then, and nothing can
/// be downloaded.
class DownloaderFactory {
 public:
    virtual ~DownloaderFactory() = default;

    /// A new downloader, which holds a reference to the enclosure.
    virtual Foundation::Returner<Downloader> makeDownloader(EnclosureCore* enclosure) = 0;

    static DownloaderFactory* current();
    /// The port must outlive its use.
    static void setCurrent(DownloaderFactory* port);
};

}  // namespace Orvane
