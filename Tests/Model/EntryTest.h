#pragma once

#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/ModelTest.h"
#include "Model/SubscriptionCore.h"
#include "Model/UnreachableAgent.h"
#include "Model/Values.h"
#include "SQLite/Transaction.h"
#include "Utilities/FileSystem.h"

#include <string>

/// A link that keeps what it is asked. It is the link of the process while it lives.
class RecordingAgent : public Orvane::UnreachableAgent {
 public:
    RecordingAgent() { setCurrent(this); }
    ~RecordingAgent() override { setCurrent(nullptr); }

    void setRead(Orvane::EntryCore* entry, bool value) override {
        calls += OVFormat("setRead(%lli,%d) ", entry->getRowID(), value ? 1 : 0);
    }
    void setFlagged(Orvane::EntryCore* entry, bool value) override {
        calls += OVFormat("setFlagged(%lli,%d) ", entry->getRowID(), value ? 1 : 0);
    }
    void setContent(Orvane::EntryCore* entry, const char* column,
                    Orvane::ContentCore* content) override {
        calls += OVFormat("setContent(%lli,%s,%s) ", entry->getRowID(), column,
                          content ? textOf(content->getData()) : "null");
    }
    void setAuthor(Orvane::EntryCore* entry, Orvane::AuthorCore* author) override {
        calls +=
            OVFormat("setAuthor(%lli,%lli) ", entry->getRowID(), author ? author->getRowID() : 0);
    }
    Orvane::AuthorCore* createAuthor(String* name, String* email, URL* url,
                                     String* contactBookUID) override {
        calls += OVFormat("createAuthor(%s,%s,%s,%s) ", textOf(name), textOf(email), textOf(url),
                          textOf(contactBookUID));
        return created;
    }
    void setContactBookUID(Orvane::AuthorCore* author, String* uid) override {
        calls += OVFormat("setContactBookUID(%lli,%s) ", author->getRowID(), textOf(uid));
    }
    bool enclosureAction(Orvane::EnclosureCore* enclosure, int action) override {
        calls += OVFormat("enclosureAction(%lli,%d) ", enclosure->getRowID(), action);
        return answer;
    }

    std::string calls;
    Orvane::AuthorCore* created = nullptr;
    bool answer = true;
};

/// A test of entries, with a stored feed, which has ID 1, and files in a directory of its own.
class EntryTest : public ModelTest {
 protected:
    EntryTest() {
        const Foundation::Ref<Foundation::URL> base =
            Foundation::URL::urlWithFileSystemPath(directory.path().c_str(), true);
        Compatibility::FileSystem::setStorageBaseURL(base);
        feed->getIdentifier();
        feed->saveChanges();
    }
    ~EntryTest() noexcept override { Compatibility::FileSystem::setStorageBaseURL(nullptr); }

    static Orvane::FeedCore* newFeed(const char* location) {
        Orvane::FeedCore* row = make<Orvane::FeedCore>();
        row->mURL.setValue(url(location));
        return row;
    }
    /// A new entry of the feed.
    Orvane::EntryCore* newEntry(const char* id = nullptr) {
        Orvane::EntryCore* entry = make<Orvane::EntryCore>();
        if (id) entry->mID.setValue(str(id));
        feed->addToEntries(entry);
        return entry;
    }
    /// The same, current and stored. It has an identifier.
    Foundation::Ref<Orvane::EntryCore> storedEntry(const char* id) {
        Foundation::Ref<Orvane::EntryCore> entry = newEntry(id);
        entry->mCurrent.setValue(true);
        entry->mLocalDateCreated.setValue(date(1000));
        entry->getIdentifier();
        entry->saveChanges();
        return entry;
    }
    /// An entry as a document has it.
    static Foundation::Ref<Orvane::EntryCore> parsed() {
        Foundation::Ref<Orvane::EntryCore> entry = make<Orvane::EntryCore>();
        entry->mCurrent.setValue(true);
        entry->mLocalDateCreated.setValue(date(1000));
        return entry;
    }
    static Orvane::EnclosureCore* enclosure(const char* location, const char* type = nullptr,
                                            long long length = 0) {
        auto* row = make<Orvane::EnclosureCore>();
        row->mURL.setValue(url(location));
        if (type) row->mMIMEType.setValue(str(type));
        row->mLength.setValue(length);
        return row;
    }
    /// A stored subscription to the feed by a client of its own.
    Foundation::Ref<Orvane::SubscriptionCore> subscribe(const char* signature) {
        auto* client = make<Orvane::ClientCore>();
        client->mSignature.setValue(str(signature));
        client->saveChanges();
        Foundation::Ref<Orvane::SubscriptionCore> made = make<Orvane::SubscriptionCore>();
        made->mClient.setValue(client);
        made->setFeed(feed.get());
        feed->saveChanges();
        return made;
    }
    static Orvane::AuthorCore* author(const char* name) {
        Orvane::AuthorCore* row = make<Orvane::AuthorCore>();
        row->mName.setValue(str(name));
        return row;
    }

    const Foundation::Ref<Orvane::FeedCore> feed = newFeed("http://e.org/feed");
    const std::string feedHash = sha1("http://e.org/feed");
};
