#pragma once

#include "Foundation/Returner.h"

namespace Foundation {
class Dictionary;
class URL;
}  // namespace Foundation

namespace Orvane {

/// What fills a new database with what there was in an earlier one. Each throws
/// `SQLite::Exception`.
struct TruthRestore {
    /// Inserts the clients, feeds and subscriptions that a `ClientsPlist` names, under the row IDs
    /// that they had, so that they still mean each other. One that the tables refuse, which only a
    /// file that somebody has edited can have, is reported and left out.
    static void insertSubscriptions(const Foundation::Dictionary* root);

    /// Gives every feed the entries of its saved document, and lets the older ones, which have
    /// files of their own, be read when they are first asked for. All of them count as read, and
    /// no enclosure is downloaded by itself.
    static void restoreEntries();
};

}  // namespace Orvane
