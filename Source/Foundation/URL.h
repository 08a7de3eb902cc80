#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URLParts.h"

#include <string>
#include <string_view>

namespace Foundation {

/// A URL as RFC 3986 has it: its text and the parts of it. A relative reference is one too, alone
/// or with the URL that it is seen from; then all accessors but `getString`, `getData` and
/// `getComponents` speak of the absolute URL that the two make. The text is ASCII.
///
/// An immutable value. Accessors that give a text give null where the URL has no such part.
class URL : public PFRefCounted {
 public:
    enum class PathStyle { POSIX };
    /// The parts of a URL in the order of its text.
    enum class Component { Scheme, User, Host, Port, Path, Query, Fragment };

    /// The URL with this text, which must follow RFC 3986 to the letter; else null, and for null
    /// and empty texts. `base` may be null.
    static URLReturner url(String* text, URL* base = nullptr);
    /// The URL that somebody meant by `text`: what a URL cannot hold is escaped, as UTF-8, and
    /// whatever had to be done is logged. Given a base, the result is absolute if that gives it a
    /// scheme. Null where there is no text or no URL can be made of it.
    static URLReturner lenientURL(String* text, URL* base);
    /// The file URL of a path, which may be any file name's bytes. A relative path counts from the
    /// current directory. Null for a null or empty path, or if the current directory is gone.
    static URLReturner urlWithFileSystemPath(const char* path, bool isDirectory);
    static URLReturner urlWithFileSystemPath(String* path, PathStyle style, bool isDirectory);

    /// The text, as given: relative if the URL was made so.
    StringReturner getString() const;
    /// The text with its percent escapes undone, as UTF-8, except those of the characters (ASCII)
    /// in `stillEscaped`. Null undoes none, the empty string all. Null if what comes out is no
    /// UTF-8.
    StringReturner getString(String* stillEscaped) const;
    /// The bytes of the text.
    DataReturner getData() const;
    /// The text of the absolute form.
    StringReturner getAbsoluteString() const;
    /// The same, with all escapes kept. Valid as long as the URL.
    const std::string& text() const { return mText; }
    /// The absolute form. Has no scheme if neither this nor its base has one.
    URLReturner getAbsoluteURL() const;

    /// As given, in any case; `isScheme` compares without case. ASCII.
    StringReturner getScheme() const;
    bool hasScheme() const { return parts().scheme.has_value(); }
    bool isScheme(std::string_view scheme) const;
    /// Escapes undone.
    StringReturner getUser() const;
    StringReturner getPassword() const;
    /// With the escapes, and the brackets of an address, as it stands; null for an empty one too.
    StringReturner getHost() const;
    /// -1 for none.
    int getPort() const;
    /// The path, escapes and all. Null where it is not one of segments: "mailto:".
    StringReturner getPath() const;
    StringReturner getQuery() const;
    StringReturner getFragment() const;
    /// All behind the scheme's colon. Null without a scheme, or if nothing is there.
    StringReturner getResourceSpecifier() const;
    /// What an HTTP request asks the host for: the path, "/" for an empty one, and "?" with the
    /// query. A URL without a path of segments gives its resource specifier without the fragment.
    StringReturner getRequestURIString() const;
    /// The text from the start of `first` to the end of `last` or, without `includeLast`, to where
    /// `last` with the mark in front of it begins. An absent part counts as an empty one. Null for
    /// an empty text.
    StringReturner getComponents(Component first, Component last, bool includeLast) const;

    /// The last segment of the path, escapes undone, without a final "/"; null if there is none or
    /// it is no UTF-8.
    StringReturner getLastPathComponent() const;
    /// What follows the last "." of that, if that is not its first character.
    StringReturner getPathExtension() const;
    /// Whether the path ends in "/", or in a "." or ".." segment.
    bool hasDirectoryPath() const;

    /// The path of a file URL as the file system takes it, without a final "/": the bytes behind
    /// the escapes. Empty where the URL is not that of a local file; an escape that no file name
    /// can have ("%00", "%2F") makes it none.
    std::string getFileSystemRepresentation() const;
    /// The same as text; null where it is empty or no UTF-8.
    StringReturner getFileSystemPath() const;

    /// This URL, if it may be offered for a click: one with a scheme that does not run a script.
    /// Null else, and for null.
    URLReturner getSanitizedURL() const;
    static URLReturner getSanitizedURL(const URL* url);
    /// The same without user and password.
    URLReturner getURLWithoutUser() const;

    /// The URL, without query and fragment, with a relative path (not escaped yet) joined to its
    /// own, whether or not that ends in "/". Throws `std::runtime_error` for what could lead
    /// elsewhere than down: an empty path, an empty, "." or ".." segment, a zero; and if this URL
    /// has no path of segments.
    URLReturner byAppending(String* path, bool isDirectory) const;
    /// The URL of the directory that holds what this one names, with its final "/". A root, or
    /// what has no path of segments, gives the URL itself.
    URLReturner byDeletingLastPathComponent() const;
    /// The URL with "." and `extension` after the last segment; a directory stays one. Throws as
    /// `byAppending` does.
    URLReturner byAppendingExtension(String* extension) const;

    /// By the text of the absolute form.
    std::size_t getHash() const override;
    bool isEqual(const PFRefCounted* other) const override;
    StringReturner toString() const override;

 private:
    explicit URL(std::string text);
    static URLReturner make(std::string text, const URL* base = nullptr);

    /// The URL that accessors speak of.
    const URL& absolute() const { return mAbsolute ? *mAbsolute.get() : *this; }
    const URLParts& parts() const { return absolute().mParts; }
    bool isLocalFile() const;
    /// The last segment's place in the path, without a final "/".
    std::string_view lastSegment() const;
    /// The URL with another path, without query and fragment.
    URLReturner withPath(const std::string& path) const;

    const std::string mText;
    URLParts mParts;     ///< views of mText
    Ref<URL> mAbsolute;  ///< null if that is this one
};

}  // namespace Foundation
