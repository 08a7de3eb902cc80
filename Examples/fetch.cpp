// Fetches a feed into memory, without subscribing to it, and prints what it has.
//
//   fetch URL

#include <Orvane/Orvane.h>

#include <cstdlib>
#include <iostream>

namespace {

constexpr double kSeconds = 60;

/// Waits until the feed has been refreshed. Whether that was in time.
bool wait(const OVFeed& feed) {
    const OVNotificationCenter::Observation observation =
        OVNotificationCenter::defaultCenter().addObserver(OVFeedRefreshingNotification, &feed,
                                                          [&](const OVNotification&) {
                                                              if (!feed.isRefreshing())
                                                                  OVRunLoop::stop();
                                                          });
    // A file may have been read already.
    return !feed.isRefreshing() || OVRunLoop::run(kSeconds);
}

void print(const OVEntry& entry) {
    std::cout << "* " << entry.titleForDisplay() << "\n";
    const std::shared_ptr<OVContent> content = entry.content() ? entry.content() : entry.summary();
    if (!content) return;
    const std::string text = content->plainTextString().value_or("");
    std::cout << "  " << text.substr(0, text.find('\n')) << "\n";
}

int fetch(const std::string& url) {
    const std::shared_ptr<OVFeed> feed = OVFeed::create(url);
    std::optional<OVError> error;
    if (!feed) {
        std::cerr << "fetch: feeds cannot be fetched from there\n";
        return EXIT_FAILURE;
    }
    if (feed->refresh(&error)) {
        if (!wait(*feed)) {
            std::cerr << "fetch: this takes too long\n";
            return EXIT_FAILURE;
        }
        error = feed->lastError();
    }
    if (error) {
        std::cerr << "fetch: " << error->toString() << "\n";
        return EXIT_FAILURE;
    }
    std::cout << feed->title().value_or("(no title)") << "\n";
    const auto byTitle = [](const OVEntry& a, const OVEntry& b) {
        return a.titleForDisplay().compare(b.titleForDisplay());
    };
    for (const std::shared_ptr<OVEntry>& entry : feed->entryEnumeratorSortedBy({byTitle})) {
        print(*entry);
    }
    return EXIT_SUCCESS;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::cerr << "usage: fetch URL\n";
        return 2;
    }
    try {
        return fetch(argv[1]);
    } catch (const OVException& exception) {
        std::cerr << "fetch: " << exception.what() << "\n";
        return EXIT_FAILURE;
    }
}
