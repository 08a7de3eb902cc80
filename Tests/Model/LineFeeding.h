#pragma once

#include "Foundation/Data.h"
#include "Foundation/Guard.h"
#include "Foundation/URL.h"
#include "Model/DocumentParser.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/FeedRefresher.h"
#include "Model/FeederFactory.h"
#include "Model/FileReader.h"

#include <functional>
#include <memory>
#include <sstream>
#include <string>

/// All that is needed to make rows of documents, which are of lines: "feed TITLE" and then a line
/// for each entry, or such a line alone. An entry is "entry ID TITLE", or with the URL of its
/// enclosure in between "enclosing ID URL TITLE". It is behind the ports while it lives.
class LineFeeding : public Orvane::DocumentParser, public Orvane::FeederFactory {
 public:
    LineFeeding() {
        DocumentParser::setCurrent(this);
        FeederFactory::setCurrent(this);
        Orvane::FileReader::setMaker(openFile);
    }
    ~LineFeeding() override {
        DocumentParser::setCurrent(nullptr);
        FeederFactory::setCurrent(nullptr);
        Orvane::FileReader::setMaker(nullptr);
    }

    /// Called before a stored document is merged into its feed.
    std::function<void(Orvane::FeedCore&)> beforeMerge;

    Foundation::Returner<Orvane::FeedCore> parseFeed(Foundation::Data*, Foundation::URL*) override {
        return nullptr;
    }
    Foundation::Returner<Orvane::EntryCore> parseEntry(Foundation::Data* data,
                                                       Foundation::URL*) override {
        return makeEntry(std::string(data->view()));
    }
    bool supportsURL(const Foundation::URL*) const override { return true; }
    Foundation::Returner<Orvane::FeedRefresher> makeFeeder(Orvane::FeedCore* feed) override {
        return Foundation::Returner<Orvane::FeedRefresher>::adopted(new Feeder(*this, *feed));
    }
    /// Gives a feed the entries of a document that it does not have.
    static void merge(Orvane::FeedCore& feed, const std::string& document) {
        std::istringstream lines(document);
        for (std::string line; std::getline(lines, line);) {
            const Foundation::AutoreleasePool pool;
            if (line.starts_with("feed ")) {
                const Foundation::Ref<Foundation::String> title =
                    Foundation::String::string(line.substr(5));
                feed.mTitle.setValue(title);
            } else {
                addEntry(feed, line);
            }
        }
        feed.saveChanges();
    }

 private:
    class Feeder : public Orvane::FeedRefresher {
     public:
        Feeder(LineFeeding& owner, Orvane::FeedCore& feed) : mOwner(owner), mFeed(feed) {}
        void removed() override {}
        bool needsRefresh() const override { return false; }
        bool refresh(bool, bool) override { return false; }
        void refreshFromData(Foundation::Data* data) override {
            if (mOwner.beforeMerge) mOwner.beforeMerge(mFeed);
            // As if it had just been fetched.
            mFeed.setXMLData(data);
            merge(mFeed, std::string(data->view()));
            mFeed.updateUnreadCounts();
        }
        Foundation::NetError getStatus() const override { return {}; }
        bool hasChanged() const override { return true; }

     private:
        LineFeeding& mOwner;
        Orvane::FeedCore& mFeed;
    };

    class WholeFile : public Orvane::FileReader {
     public:
        explicit WholeFile(Foundation::URL* url) : mURL(url) {}
        Foundation::DataReturner finish() override {
            return Foundation::Data::dataFromResource(mURL);
        }

     private:
        Foundation::Ref<Foundation::URL> mURL;
    };
    static std::unique_ptr<Orvane::FileReader> openFile(Foundation::URL* url) {
        return std::make_unique<WholeFile>(url);
    }

    static Foundation::Returner<Orvane::EntryCore> makeEntry(const std::string& line) {
        std::istringstream words(line);
        std::string kind, id, enclosure, title;
        words >> kind >> id;
        if (kind == "enclosing") words >> enclosure;
        std::getline(words >> std::ws, title);
        if (title.empty()) return nullptr;
        Foundation::Ref<Orvane::EntryCore> entry{
            Foundation::Returner<Orvane::EntryCore>::adopted(new Orvane::EntryCore)};
        entry->mID.setValue(Foundation::String::string(id));
        entry->mTitle.setValue(Foundation::String::string(title));
        entry->mCurrent.setValue(true);
        if (!enclosure.empty()) addEnclosure(*entry, enclosure);
        return Foundation::Returner<Orvane::EntryCore>(std::move(entry));
    }
    static void addEnclosure(Orvane::EntryCore& entry, const std::string& address) {
        const Foundation::Ref<Orvane::EnclosureCore> enclosure{
            Foundation::Returner<Orvane::EnclosureCore>::adopted(new Orvane::EnclosureCore)};
        const Foundation::Ref<Foundation::String> text = Foundation::String::string(address);
        enclosure->mURL.setValue(Foundation::URL::url(text));
        entry.addToEnclosures(enclosure);
    }
    static void addEntry(Orvane::FeedCore& feed, const std::string& line) {
        const Foundation::Ref<Orvane::EntryCore> entry = makeEntry(line);
        if (!entry.get()) return;
        feed.addToEntries(entry);
        const Foundation::Ref<Orvane::EntryCore> stored =
            Orvane::EntryCore::getEntryWithIdentifier(entry->getIdentifier());
        if (stored.get()) return feed.removeFromEntries(entry);
        entry->mLocalDateCreated.setValue(Foundation::Date::now());
        entry->saveChanges();
    }
};
