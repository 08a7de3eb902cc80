// An application: it uses the library as any does, by its public headers and what it exports.
//
//   test_application IDENTIFIER              turns GLib's main loop
//   test_application IDENTIFIER unturned     turns no loop, and only does what it is told
//
// Does what the lines of its input say, and ends with the input. Each is answered by a line that
// begins with "= ", the first of which says whether it has its client. What the delegate is told
// goes out as lines that begin with "! ". Feeds are named by the last part of their URLs, entries
// by their titles. Whatever it waits for, it ends by a signal when nobody has told it anything for
// some minutes.

#include <Orvane/Orvane.h>
#include <glib-unix.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

namespace {

using Feed = std::shared_ptr<OVFeed>;
using Texts = std::vector<std::string>;

/// Longer where the test waits for an agent that idles.
unsigned patienceSeconds() {
    return std::getenv("ORVANE_SLOW_TESTS") ? 400 : 100;
}

void tell(const char* mark, const std::string& text) {
    std::printf("%s %s\n", mark, text.c_str());
    std::fflush(stdout);
}

std::string joined(const Texts& texts) {
    std::string all;
    for (const std::string& text : texts) {
        all += (all.empty() ? "" : " ") + text;
    }
    return all;
}

std::string nameOf(const Feed& feed) {
    const std::string url = feed->URL().value_or("");
    return url.substr(url.rfind('/') + 1);
}

std::string describe(const std::optional<OVError>& error) {
    return error ? "failed " + error->domain() + " " + std::to_string(error->code()) : "failed";
}

/// Tells all that it is told.
class TellingDelegate : public OVClientDelegate {
 public:
    void feedDidBeginRefresh(const Feed& feed) override { tell("!", "begin " + nameOf(feed)); }
    void feedDidEndRefresh(const Feed& feed) override { tell("!", "end " + nameOf(feed)); }
    void feedDidAddEntries(const Feed& feed, const OVEntry::List& entries) override {
        tellOf("added", feed, entries);
    }
    void feedDidRemoveEntriesWithIdentifiers(const Feed& feed, const Texts& all) override {
        tell("!", "removed " + nameOf(feed) + " " + std::to_string(all.size()));
    }
    void feedDidUpdateEntries(const Feed& feed, const OVEntry::List& entries) override {
        tellOf("updated", feed, entries);
    }
    void feedDidChangeFlagsInEntries(const Feed& feed, const OVEntry::List& entries) override {
        tellOf("flags", feed, entries);
    }
    void feedUnreadCountChanged(const Feed& feed) override {
        tell("!", "count " + nameOf(feed) + " " + std::to_string(feed->unreadCount()));
    }

 private:
    static void tellOf(const char* what, const Feed& feed, const OVEntry::List& entries) {
        Texts titles;
        for (const std::shared_ptr<OVEntry>& entry : entries) {
            titles.push_back(entry->title().value_or("?"));
        }
        std::sort(titles.begin(), titles.end());
        tell("!", OVFormat("%s %s %s", what, nameOf(feed), joined(titles)));
    }
};

class Application {
 public:
    /// Whether it has its client.
    bool open(const std::string& identifier) {
        OVClient::setApplicationIdentifier(identifier);
        std::optional<OVError> error;
        mClient = OVClient::applicationClient(&error);
        tell("=", mClient ? "ready" : describe(error));
        if (mClient) mClient->setDelegate(&mDelegate);
        return mClient != nullptr;
    }
    void close() { mClient->setDelegate(nullptr); }
    void obey(const std::string& line) {
        alarm(patienceSeconds());
        std::istringstream words(line);
        std::string verb;
        std::string object;
        words >> verb >> object;
        try {
            tell("=", answer(verb, object));
        } catch (const OVException& exception) {
            const OVError* error = exception.error();
            tell("=", describe(error ? std::optional<OVError>(*error) : std::nullopt));
        }
    }

 private:
    using Verb = std::string (Application::*)(const std::string&);

    std::string answer(const std::string& verb, const std::string& object) {
        static const std::map<std::string, Verb> sVerbs = {
            {"add", &Application::add},         {"remove", &Application::remove},
            {"feeds", &Application::feeds},     {"refresh", &Application::refresh},
            {"refreshing", &Application::busy}, {"title", &Application::title},
            {"count", &Application::count},     {"list", &Application::list},
            {"query", &Application::query},     {"state", &Application::state},
            {"read", &Application::read},       {"flag", &Application::flag},
            {"unflag", &Application::unflag},   {"all", &Application::all},
            {"batch", &Application::batch},     {"interval", &Application::interval},
        };
        const auto found = sVerbs.find(verb);
        return found != sVerbs.end() ? (this->*found->second)(object) : "what?";
    }

    // Feeds. The object is a URL, or else the name of a feed.

    std::string add(const std::string& url) {
        std::optional<OVError> error;
        return mClient->addFeedWithURL(url, &error) ? "added" : describe(error);
    }
    std::string remove(const std::string& name) {
        return mClient->removeFeed(feed(name)) ? "removed" : "failed";
    }
    std::string feeds(const std::string&) {
        Texts names;
        for (const Feed& each : mClient->feeds()) {
            names.push_back(nameOf(each));
        }
        std::sort(names.begin(), names.end());
        return joined(names);
    }
    std::string refresh(const std::string& name) {
        std::optional<OVError> error;
        return feed(name)->refresh(&error) ? "started" : describe(error);
    }
    std::string busy(const std::string& name) { return feed(name)->isRefreshing() ? "yes" : "no"; }
    std::string title(const std::string& name) { return feed(name)->title().value_or("none"); }
    std::string count(const std::string& name) { return std::to_string(feed(name)->unreadCount()); }
    std::string interval(const std::string& name) {
        const Feed changed = feed(name);
        OVFeedSettings settings = changed->settings().value();
        settings.setRefreshInterval(settings.refreshInterval() + 3600);
        changed->setSettings(settings);
        return OVFormat("%.0f", changed->settings()->refreshInterval());
    }

    // Entries. The object is a title; a list of entries is one of titles and states.

    std::string list(const std::string& name) { return describe(feed(name)->entries()); }
    std::string query(const std::string&) {
        OVEntryQuery query;
        query.order = OVEntryQuery::Order::ByTitle;
        return describe(mClient->entries(query));
    }
    std::string state(const std::string& title) { return stateOf(*entry(title)); }
    std::string read(const std::string& title) {
        entry(title)->setRead(true);
        return stateOf(*entry(title));
    }
    std::string flag(const std::string& title) {
        entry(title)->setFlagged(true);
        return stateOf(*entry(title));
    }
    std::string unflag(const std::string& title) {
        entry(title)->setFlagged(false);
        return stateOf(*entry(title));
    }
    std::string all(const std::string&) {
        OVEntry::setFlags(mClient->entries({}), true, true);
        return query("");
    }
    std::string batch(const std::string&) {
        OVEntry::setEntries(mClient->entries({}), true);
        return query("");
    }

    /// Objects are held once they have been looked for, as an application that shows them does.
    Feed feed(const std::string& name) {
        Feed& held = mFeeds[name];
        for (const Feed& each : held ? std::vector<Feed>() : mClient->feeds()) {
            if (nameOf(each) == name) held = each;
        }
        if (!held) throw OVException("no such feed");
        return held;
    }
    std::shared_ptr<OVEntry> entry(const std::string& title) {
        std::shared_ptr<OVEntry>& held = mEntries[title];
        for (const auto& each : held ? OVEntry::List() : mClient->entries({})) {
            if (each->title() == title) held = each;
        }
        if (!held) throw OVException("no such entry");
        return held;
    }
    static std::string stateOf(const OVEntry& entry) {
        const std::string marks =
            std::string(entry.isRead() ? "r" : "") + (entry.isFlagged() ? "f" : "");
        return entry.title().value_or("?") + ":" + marks;
    }
    static std::string describe(const OVEntry::List& entries) {
        Texts states;
        for (const std::shared_ptr<OVEntry>& entry : entries) {
            states.push_back(stateOf(*entry));
        }
        std::sort(states.begin(), states.end());
        return joined(states);
    }
    static std::string describe(const std::optional<OVError>& error) { return ::describe(error); }

    TellingDelegate mDelegate;
    std::shared_ptr<OVClient> mClient;
    std::map<std::string, Feed> mFeeds;
    std::map<std::string, std::shared_ptr<OVEntry>> mEntries;
};

/// The input, line by line.
class Input {
 public:
    /// Waits for some, and calls with each line that is complete. False at the end.
    bool take(const std::function<void(const std::string&)>& call) {
        char bytes[4096];
        const ssize_t size = read(STDIN_FILENO, bytes, sizeof(bytes));
        if (size <= 0) return false;
        mText.append(bytes, static_cast<std::size_t>(size));
        for (std::size_t end; (end = mText.find('\n')) != std::string::npos;) {
            const std::string line = mText.substr(0, end);
            mText.erase(0, end + 1);
            call(line);
        }
        return true;
    }

 private:
    std::string mText;
};

void turn(const std::function<bool()>& takeInput) {
    struct State {
        const std::function<bool()>& takeInput;
        GMainLoop* loop;
    } state{takeInput, g_main_loop_new(nullptr, FALSE)};
    g_unix_fd_add(
        STDIN_FILENO, static_cast<GIOCondition>(G_IO_IN | G_IO_HUP),
        [](gint, GIOCondition, gpointer data) -> gboolean {
            const State& that = *static_cast<State*>(data);
            if (that.takeInput()) return G_SOURCE_CONTINUE;
            g_main_loop_quit(that.loop);
            return G_SOURCE_REMOVE;
        },
        &state);
    g_main_loop_run(state.loop);
    g_main_loop_unref(state.loop);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2) return 2;
    alarm(patienceSeconds());
    Application application;
    if (!application.open(argv[1])) return 1;
    Input input;
    const std::function<bool()> takeInput = [&] {
        return input.take([&](const std::string& line) { application.obey(line); });
    };
    if (argc > 2 && argv[2] == std::string_view("unturned")) {
        while (takeInput()) {
        }
    } else {
        turn(takeInput);
    }
    application.close();
    return 0;
}
