#pragma once

#include "Foundation/Data.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/NetError.h"
#include "Foundation/URL.h"
#include "Model/CredentialStore.h"
#include "Model/DocumentParser.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/FeederFactory.h"
#include "Model/UnreachableAgent.h"

#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

// What feeds ask of others, each answered as the test says.

/// A feeder that does what the test says.
class FakeFeeder : public Orvane::FeedRefresher {
 public:
    void removed() override { calls += "removed "; }
    bool needsRefresh() const override { return isDue; }
    bool refresh(bool force, bool queued) override {
        calls += std::string("refresh(") + (force ? "1" : "0") + (queued ? ",1) " : ",0) ");
        return starts;
    }
    void refreshFromData(Foundation::Data* data) override {
        calls += "parse ";
        parsed.emplace_back(data->view());
    }
    Foundation::NetError getStatus() const override { return status; }
    bool hasChanged() const override { return changed; }

    std::string calls;
    std::vector<std::string> parsed;
    bool isDue = false;
    bool starts = true;
    bool changed = false;
    Foundation::NetError status;
};

/// Makes one feeder, which the test can look at. It is the port of the process while it lives.
class FakeFeeders : public Orvane::FeederFactory {
 public:
    FakeFeeders() { setCurrent(this); }
    ~FakeFeeders() override { setCurrent(nullptr); }

    bool supportsURL(const Foundation::URL* url) const override { return !url->isScheme("gopher"); }
    Foundation::Returner<Orvane::FeedRefresher> makeFeeder(Orvane::FeedCore* feed) override {
        ++made;
        madeFor = feed;
        return Foundation::Returner<Orvane::FeedRefresher>(
            Foundation::Ref<Orvane::FeedRefresher>(feeder.get()));
    }

    Foundation::Ref<FakeFeeder> feeder = Foundation::Returner<FakeFeeder>::adopted(new FakeFeeder);
    int made = 0;
    const Orvane::FeedCore* madeFor = nullptr;
};

/// A link that keeps what it is asked. It is the link of the process while it lives.
class FakeAgent : public Orvane::UnreachableAgent {
 public:
    FakeAgent() { setCurrent(this); }
    ~FakeAgent() override { setCurrent(nullptr); }

    NetError refresh(Orvane::FeedCore* feed, bool force) override {
        calls += OVFormat("refresh(%lli,%d) ", feed->getRowID(), force ? 1 : 0);
        return answer;
    }
    void recoverOldEntries(Orvane::FeedCore* feed) override {
        calls += OVFormat("recoverOldEntries(%lli) ", feed->getRowID());
    }
    void setLogin(Orvane::FeedCore* feed, String* login) override {
        calls += OVFormat("setLogin(%lli,%@) ", feed->getRowID(), login);
    }

    std::string calls;
    NetError answer;
};

/// Reads "feed TITLE" as a feed, and "entry ID TITLE" as an entry; "throw" makes it throw. It is
/// the port of the process while it lives.
class FakeParser : public Orvane::DocumentParser {
 public:
    FakeParser() { setCurrent(this); }
    ~FakeParser() override { setCurrent(nullptr); }

    Foundation::Returner<Orvane::FeedCore> parseFeed(Foundation::Data* data,
                                                     Foundation::URL* url) override {
        std::istringstream words = open(data, url);
        if (kind != "feed") return nullptr;
        Foundation::Ref<Orvane::FeedCore> feed = make<Orvane::FeedCore>();
        feed->mTitle.setValue(word(words));
        return feed;
    }
    Foundation::Returner<Orvane::EntryCore> parseEntry(Foundation::Data* data,
                                                       Foundation::URL* url) override {
        std::istringstream words = open(data, url);
        if (kind != "entry") return nullptr;
        Foundation::Ref<Orvane::EntryCore> entry = make<Orvane::EntryCore>();
        entry->mID.setValue(word(words));
        entry->mTitle.setValue(word(words));
        entry->mCurrent.setValue(true);
        return entry;
    }

    std::string calls;  ///< the documents, with a blank behind each
    std::string lastURL;

 private:
    template <class T>
    static Foundation::Ref<T> make() {
        return Foundation::Returner<T>::adopted(new T);
    }
    static Foundation::String* word(std::istringstream& words) {
        std::string text;
        words >> text;
        return Foundation::String::string(text);
    }
    std::istringstream open(Foundation::Data* data, Foundation::URL* url) {
        calls += std::string(data->view()) + " ";
        lastURL = url ? url->text() : "";
        std::istringstream words{std::string(data->view())};
        words >> kind;
        if (kind == "throw") throw std::runtime_error("parser");
        return words;
    }

    std::string kind;
};

/// Keeps what is to be stored. It is the port of the process while it lives.
class FakeCredentials : public Orvane::CredentialStore {
 public:
    FakeCredentials() { setCurrent(this); }
    ~FakeCredentials() override { setCurrent(nullptr); }

    Foundation::NetError saveInternetPassword(Foundation::URL* url, Foundation::String* user,
                                              Foundation::String* password) override {
        saved += OVFormat("%@ %@ %@ ", url, user, password);
        return answer;
    }

    std::string saved;
    Foundation::NetError answer;
};
