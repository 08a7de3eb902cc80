#include "Foundation/Logger.h"
#include "Model/AgentLink.h"
#include "Model/AuthorCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

// What an entry belongs to, and what belongs to it.

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::Ref;
using SQLite::BasicRowIterator;
using SQLite::RowIterator;

EntryCore::~EntryCore() {
    // Who still holds one of the new enclosures must not find this behind it.
    for (const Ref<SQLite::Row>& row : mEnclosures.getNewRows()) {
        static_cast<EnclosureCore&>(*row).mEntry.clearChanged();
    }
}

FeedCore* EntryCore::getFeed() const {
    const SQLite::RowID feed = mFeed.getRowID();
    // Nothing could be read of a feed that has gone and left its entry behind.
    if (feed != 0 && !_isInFile(SQLite::TableOf<FeedCore>::instance(), feed)) return nullptr;
    return mFeed.getValue();
}

void EntryCore::setFeed(FeedCore* feed) {
    // The old feed may have the last reference. An object that nobody owns yet must not get one.
    const Ref<EntryCore> self = getRefCount() > 0 ? this : nullptr;
    const Ref<FeedCore> old = mFeed.getValue();
    if (Foundation::IsEqual(old.get(), feed)) return;
    mFeed.setValue(feed);
    if (old.get()) old->removeFromEntries(this);
    if (feed) feed->addToEntries(this);
}

AuthorCore* EntryCore::getAuthor() const {
    return mAuthor.getValue();
}

void EntryCore::setAuthor(AuthorCore* author) {
    mAuthor.setValue(author);
}

bool EntryCore::public_setAuthor(AuthorCore* author) {
    if (isChangeable()) {
        setAuthor(author);
        return true;
    }
    const Ref<AuthorCore> stored = author ? author->addToDatabase() : nullptr;
    if (author && !stored.get()) {
        Foundation::gWarn.log("Couldn't add author to database");
        return false;
    }
    AgentLink::current().setAuthor(this, stored.get());
    mAuthor.unload();
    return true;
}

RowIterator<AuthorCore> EntryCore::getAuthors(const char*) const {
    BasicRowIterator::NewRows rows;
    if (AuthorCore* author = getAuthor()) rows.emplace_back(author);
    return {nullptr, rows};
}

RowIterator<AuthorCore> EntryCore::getContributors(const char*) const {
    return {nullptr, BasicRowIterator::NewRows()};
}

void EntryCore::addToAuthors(AuthorCore* author) {
    if (!author || author->isEmpty()) return;
    const AuthorCore* present = getAuthor();
    if (present && !IsContentEqual(present, author)) {
        gLogSub.log("    EntryCore: Multiple authors not supported yet (ignoring subsequent ones)");
    } else if (!present) {
        public_setAuthor(author);
    }
}

void EntryCore::useDefaultAuthors(ArrayOf<AuthorCore>* authors, ArrayOf<AuthorCore>*) {
    if (authors && !authors->isEmpty() && !getAuthor()) addToAuthors(authors->first());
}

RowIterator<EnclosureCore> EntryCore::getEnclosures(const char* condition) const {
    return RowIterator<EnclosureCore>(mEnclosures, condition);
}

void EntryCore::addToEnclosures(EnclosureCore* enclosure) {
    mEnclosures.add(enclosure);
    enclosure->setEntry(this);
}

void EntryCore::removeFromEnclosures(EnclosureCore* enclosure) {
    const Ref<EnclosureCore> kept = enclosure;
    mEnclosures.remove(enclosure);
    enclosure->setEntry(nullptr);
}

}  // namespace Orvane
