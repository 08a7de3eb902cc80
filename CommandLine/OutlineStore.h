#pragma once

#include "Outline.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Commands {

/// What the user has sorted feeds into, which the database does not keep: folders, titles and
/// attributes of outlines that were imported. It stands in an OPML file of the command line's own,
/// one for each client.
class OutlineStore {
 public:
    /// Reads the file, if it is there.
    explicit OutlineStore(const std::string& client);

    const std::vector<Outline>& outlines() const { return mOutlines; }

    /// Adds what is not there yet, in folders of the same names. Of a feed that is in a folder
    /// already, title and attributes become those of the new one.
    void merge(const std::vector<Outline>& outlines);
    /// Writes the file, which is there as a whole before and after. Throws `Failure`.
    void save() const;

    /// All feeds of a client where the user has them; those that are in no folder at the end.
    /// Folders without feeds go. `feeds` are what the client has: they count for title and page.
    static std::vector<Outline> arranged(const std::vector<Outline>& outlines,
                                         const std::vector<Outline>& feeds);

 private:
    std::filesystem::path mFile;
    std::vector<Outline> mOutlines;
};

}  // namespace Commands
