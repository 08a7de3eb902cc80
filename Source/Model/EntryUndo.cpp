#include "Model/EntryUndo.h"

#include "Foundation/ArrayOf.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::Ref;

namespace {

void giveUpRow(Core* row) {
    if (!row) return;
    if (row->getRowID() != 0) {
        if (row->isChanged()) row->unload();
    } else if (row->getTable()) {
        row->deleteRow();
    }
}

}  // namespace

void EntryUndo::giveUp(EntryCore* entry) {
    const Ref<EntryCore> kept = entry;
    giveUpRow(entry->getContent());
    giveUpRow(entry->getSummary());
    giveUpRow(entry->getXMLRepresentation());
    const Ref<ArrayOf<EnclosureCore>> enclosures = entry->getEnclosures(nullptr).allRows();
    for (EnclosureCore* enclosure : *enclosures) {
        entry->mEnclosures.remove(enclosure);
        giveUpRow(enclosure);
    }
    // Whether the file has it does not matter here, and it may be the file that fails.
    const Ref<FeedCore> feed = entry->mFeed.getValue();
    if (entry->getRowID() == 0) {
        if (feed.get()) feed->removeFromEntries(entry);
        if (entry->getTable()) entry->deleteRow();
    } else {
        if (feed.get()) feed->mEntries.remove(entry);
        entry->unload();
    }
}

}  // namespace Orvane
