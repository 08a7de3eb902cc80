#pragma once

namespace Orvane {

class EntryCore;

/// Gives up what has been done to an entry and is not in the file: behind a failure, so that it
/// does not come in the way of whatever is saved next.
struct EntryUndo {
    /// A stored entry is what the file says of it; a new one is a free object, without a feed.
    /// Its contents and enclosures go the same way.
    static void giveUp(EntryCore* entry);
};

}  // namespace Orvane
