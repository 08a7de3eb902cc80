#pragma once

#include "Foundation/DictionaryOf.h"

#include <string>
#include <string_view>

namespace Foundation {

/// The file of one preference domain: an XML property list, `<domain>.plist` in the folder
/// "orvane" of the user's configuration. A file that is replaced is replaced whole, so it may be
/// read at any time; who replaces it holds a `PreferenceLock`.
///
/// Any thread. Does not log.
class PreferenceFile {
 public:
    enum class State {
        Read,
        Missing,
        Damaged,  ///< there is something that cannot be taken for preferences
        Failed,   ///< it cannot be told now
    };
    struct Content {
        State state = State::Missing;
        int error = 0;             ///< the `errno` of `Failed`
        std::string reason{};      ///< of `Damaged` and `Failed`, for the log
        Ref<Dictionary> values{};  ///< of `Read`
    };

    /// The path of a domain's file: in `$XDG_CONFIG_HOME` if that is absolute, else in
    /// "~/.config". All of a domain's name but ASCII letters, digits, "-", "_" and inner "." is
    /// escaped as in URLs, so no name leads elsewhere or to another one's file.
    static std::string pathOfDomain(std::string_view domain);

    explicit PreferenceFile(std::string path) : mPath(std::move(path)) {}

    const std::string& getPath() const { return mPath; }
    /// The folder that the file is in, which may not exist.
    std::string getFolder() const;

    Content read() const;
    /// Makes `values` the file's content, on the disk. Gives 0 or an `errno`.
    [[nodiscard]] int write(const Dictionary& values) const;
    /// Gives the file another name in its folder, one that none has, and sets `newPath` to it.
    /// Gives 0 or an `errno`. REQUIRES: the caller holds the folder's lock.
    [[nodiscard]] int setAside(std::string& newPath) const;

 private:
    std::string mPath;
};

}  // namespace Foundation
