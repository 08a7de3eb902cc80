#pragma once

#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/FeedFakes.h"
#include "Model/ModelTest.h"
#include "Model/SubscriptionCore.h"
#include "Utilities/FileSystem.h"

#include <filesystem>
#include <string>
#include <utility>

/// A test of feeds, whose files are in a directory of its own.
class FeedTest : public ModelTest {
 protected:
    FeedTest() {
        const Foundation::Ref<Foundation::URL> base =
            Foundation::URL::urlWithFileSystemPath(directory.path().c_str(), true);
        Compatibility::FileSystem::setStorageBaseURL(base);
    }
    ~FeedTest() noexcept override { Compatibility::FileSystem::setStorageBaseURL(nullptr); }

    // What these make is kept by the test's pool.

    template <class T>
    static T* row() {
        return Foundation::Returner<T>::adopted(new T);
    }
    static Foundation::String* string(std::string text) {
        return Foundation::String::string(std::move(text));
    }
    static Foundation::URL* url(const char* text) { return Foundation::URL::url(string(text)); }
    static Foundation::Data* data(std::string bytes) {
        return Foundation::Data::adopt(std::move(bytes));
    }
    static Foundation::Date* date(double time) { return Foundation::Date::date(time); }
    static std::string text(const Foundation::String* string) {
        return string ? string->utf8() : "null";
    }
    static std::string text(const Foundation::URL* url) { return url ? url->text() : "null"; }
    static std::string text(const Foundation::Data* data) {
        return data ? std::string(data->view()) : "null";
    }

    /// A feed in memory.
    static Orvane::FeedCore* freeFeed(const char* address = kAddress) {
        auto* feed = row<Orvane::FeedCore>();
        feed->mURL.setValue(url(address));
        return feed;
    }
    static Orvane::FeedCore* storedFeed(const char* address = kAddress) {
        Orvane::FeedCore* feed = freeFeed(address);
        feed->getIdentifier();
        feed->saveChanges();
        return feed;
    }
    /// A client that is in use.
    static Orvane::ClientCore* storedClient(const char* signature) {
        auto* client = row<Orvane::ClientCore>();
        client->mSignature.setValue(string(signature));
        client->mDateUsed.setValue(Foundation::Date::now());
        client->saveChanges();
        return client;
    }
    /// A subscription that refreshes in the background. No feed makes it the client's settings.
    static Orvane::SubscriptionCore* subscribe(Orvane::ClientCore* client, Orvane::FeedCore* feed,
                                               double refreshInterval = 0) {
        auto* made = row<Orvane::SubscriptionCore>();
        made->mClient.setValue(client);
        made->setFeed(feed);
        made->mRefreshInterval.setValue(refreshInterval);
        made->mRefreshesInBackground.setValue(true);
        made->saveChanges();
        if (feed) feed->mSubscriptions.remove(made);
        return made;
    }

    /// Leaves a mark behind so many times now, as processes do that go down.
    void leaveMarks(const Foundation::URL* document, int times) const {
        directory.writeFile(
            "Orvane/Feeds/.parsing",
            OVFormat("%d %.3f %s\n", times, clock.now(), document->getFileSystemRepresentation()));
    }
    static bool exists(const std::string& file) { return std::filesystem::exists(file); }
    std::string truth(const std::string& name) const {
        return directory / ("Orvane/Feeds/" + name);
    }

    Support::LogCapture log;

    static constexpr const char* kAddress = "http://example.org/feed";
    /// The SHA-1 of that address.
    static constexpr const char* kIdentifier = "456eb7419d85e10335c39aa5b39a18804268aec0";
};
