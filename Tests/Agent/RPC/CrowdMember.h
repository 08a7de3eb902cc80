#pragma once

#include "Foundation/Ref.h"
#include "Model/EntryCore.h"

#include <vector>

/// One of many clients of one agent. It has all entries in memory, and changes those of its own:
/// 20 for each member, in the order of their numbers.
class CrowdMember {
 public:
    static constexpr int kOwnEntries = 20;

    /// Opens the process's session on a storage.
    static void openSession(const char* base);

    /// Reads all entries. Members are numbered from 1.
    explicit CrowdMember(int number);

    /// Makes the `i`-th of its calls, which are of several kinds. Throws if it fails.
    void change(int i) const;
    /// Serves what has come for the process by now, such as the news of what others have changed.
    static void listen();
    /// Whether all that is in memory is as in the file.
    bool isEqual() const;

 private:
    const int mFirst;
    std::vector<Foundation::Ref<Orvane::EntryCore>> mEntries;
};
