#pragma once

#include "Foundation/Uncopyable.h"

#include <string>

namespace Foundation {
class URL;
}

namespace Orvane {

/// Marks a stored document as being parsed, for as long as it lives. A document that brings the
/// process down leaves its mark behind; after two of them it is not parsed again for a day, so that
/// it does not do that at every start.
///
/// The marks are in a file of the truth directory, a line each. It is not synced: what goes down
/// with the machine was not the document's doing.
class ParseMark : Foundation::Uncopyable {
 public:
    static constexpr int kMostLeftBehind = 2;
    static constexpr double kBlockedSeconds = 86400;

    /// `document` is the stored document's file; null for one that is not stored, which gets no
    /// mark. Within the life of another mark of the same document this one does nothing.
    explicit ParseMark(const Foundation::URL* document);
    ~ParseMark();

    /// Whether the document must not be parsed now. It has no new mark then.
    bool isBlocked() const { return mIsBlocked; }

 private:
    std::string mName;  ///< empty if there is no mark to be taken off
    bool mIsBlocked = false;
};

}  // namespace Orvane
