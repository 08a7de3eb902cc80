#pragma once

#include "Model/AuthorCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/ModelTest.h"
#include "Model/Values.h"
#include "SQLite/Transaction.h"

#include <string>

/// A test of entries, with a stored feed, which has ID 1.
class EntryTest : public ModelTest {
 protected:
    EntryTest() {
        feed->getIdentifier();
        feed->saveChanges();
    }

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
    static Orvane::AuthorCore* author(const char* name) {
        Orvane::AuthorCore* row = make<Orvane::AuthorCore>();
        row->mName.setValue(str(name));
        return row;
    }

    const Foundation::Ref<Orvane::FeedCore> feed = newFeed("http://e.org/feed");
    const std::string feedHash = sha1("http://e.org/feed");
};
