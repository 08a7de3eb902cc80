#include "Utilities/FileDeletionQueue.h"
#include "Utilities/FileUtils.h"

#include <string>
#include <vector>

namespace Orvane {

namespace {

FileDeletionQueue::Item itemFor(const Foundation::URL* url) {
    return {url->getFileSystemRepresentation(), url->text()};
}

}  // namespace

void FileUtils::asyncDeleteFiles(ArrayOfURLs* urls) {
    if (!urls) return;
    std::vector<FileDeletionQueue::Item> items;
    for (const URL* url : *urls) {
        if (url) items.push_back(itemFor(url));
    }
    FileDeletionQueue::shared().add(std::move(items), false);
}

void FileUtils::asyncDeleteDirectory(URL* url) {
    if (url) FileDeletionQueue::shared().add({itemFor(url)}, true);
}

bool FileUtils::isDeletingFilesAsynchronously() {
    return FileDeletionQueue::shared().isBusy();
}

}  // namespace Orvane
