// Subscribes to a feed and prints what happens to its entries, whoever makes it happen.
//
//   watch URL [SECONDS]
//
// Ends after so many seconds, or never. The subscription stays, and the feed is refreshed in the
// background from then on: "watch" finds it again, and tells of what has come meanwhile.

#include <Orvane/Orvane.h>

#include <cstdlib>
#include <iostream>
#include <limits>

namespace {

using Feed = std::shared_ptr<OVFeed>;

/// Prints what it is told, a line for each entry, at once.
class Printer : public OVClientDelegate {
 public:
    /// Ends what came of a refresh, or of somebody's change of flags.
    void feedDidEndRefresh(const Feed& feed) override {
        const std::optional<OVError> error = feed->lastError();
        std::cout << "done: " << feed->title().value_or("(no title)") << ", " << feed->unreadCount()
                  << " unread";
        if (error) std::cout << ", " << error->toString();
        std::cout << std::endl;
    }
    void feedDidAddEntries(const Feed&, const OVEntry::List& entries) override {
        print("added", entries);
    }
    void feedDidUpdateEntries(const Feed&, const OVEntry::List& entries) override {
        print("updated", entries);
    }
    void feedDidRemoveEntriesWithIdentifiers(const Feed&,
                                             const std::vector<std::string>& gone) override {
        for (const std::string& identifier : gone) {
            std::cout << "removed: " << identifier << std::endl;
        }
    }
    void feedDidChangeFlagsInEntries(const Feed&, const OVEntry::List& entries) override {
        for (const std::shared_ptr<OVEntry>& entry : entries) {
            std::cout << (entry->isRead() ? "read: " : "unread: ") << entry->titleForDisplay()
                      << (entry->isFlagged() ? " (flagged)" : "") << std::endl;
        }
    }

 private:
    static void print(const char* what, const OVEntry::List& entries) {
        for (const std::shared_ptr<OVEntry>& entry : entries) {
            std::cout << what << ": " << entry->titleForDisplay() << std::endl;
        }
    }
};

/// The feed of a URL, subscribed to; null, with the error, if that cannot be.
Feed subscribe(OVClient& client, const std::string& url, std::optional<OVError>& error) {
    const Feed known = client.feedWithURL(url);
    return known ? known : client.addFeedWithURL(url, &error);
}

int watch(const std::string& url, double seconds) {
    OVClient::setApplicationIdentifier("org.example.orvane-watch");
    std::optional<OVError> error;
    const std::shared_ptr<OVClient> client = OVClient::applicationClient(&error);
    Printer printer;
    if (client) client->setDelegate(&printer);
    const Feed feed = client ? subscribe(*client, url, error) : nullptr;
    if (!feed || !feed->refresh(&error)) {
        std::cerr << "watch: " << (error ? error->toString() : "no reason is known") << "\n";
        if (client) client->setDelegate(nullptr);
        return EXIT_FAILURE;
    }
    OVRunLoop::run(seconds);
    client->setDelegate(nullptr);
    return EXIT_SUCCESS;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2 && argc != 3) {
        std::cerr << "usage: watch URL [SECONDS]\n";
        return 2;
    }
    try {
        return watch(argv[1], argc == 3 ? std::strtod(argv[2], nullptr)
                                        : std::numeric_limits<double>::infinity());
    } catch (const OVException& exception) {
        std::cerr << "watch: " << exception.what() << "\n";
        return EXIT_FAILURE;
    }
}
