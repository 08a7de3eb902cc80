#pragma once

#include "Foundation/Bytes.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace Foundation {

class Data;
class MutableData;
struct NetError;

/// A block of bytes. Immutable for who holds it as this.
class Data : public PFRefCounted {
 public:
    /// A copy of `size` bytes or, without `copy`, a view of them, which must then outlive the data.
    /// Throws `AssertionFailure` for bytes at no place.
    static DataReturner data(const void* bytes, std::size_t size, bool copy = true);
    static DataReturner data(Bytes bytes) { return data(bytes.getBegin(), bytes.getLength()); }
    /// Takes the bytes over.
    static DataReturner adopt(std::string bytes);

    /// No bytes, with room for `size`.
    static Returner<MutableData> mutableData(std::size_t size = 0);
    /// A copy of the bytes.
    static Returner<MutableData> mutableData(Bytes bytes);

    /// The content of the file that a URL names. Null, with the error, where it cannot be read: see
    /// `fileError`; a URL of something else than a local file is code -11 of domain 15. Throws
    /// `AssertionFailure` for null.
    static DataReturner dataFromResource(URL* url, NetError& error);
    static DataReturner dataFromResource(URL* url);
    /// Makes these bytes the whole content of the file that a URL names, in one step; see
    /// `AtomicFile`. False, with the error as above, if that fails.
    [[nodiscard]] bool writeToResource(URL* url, NetError& error) const;
    [[nodiscard]] bool writeToResource(URL* url) const;

    /// The bytes of pairs of hexadecimal digits, of either case; an odd last character is ignored.
    /// Null for null, and if another character stands among the pairs.
    static DataReturner dataFromHex(const String* hex);
    /// The bytes of a base64 text, see `Base64::decode`. Throws `AssertionFailure` for null.
    static DataReturner dataFromBase64(const String* base64);

    /// With "=" for padding, and no line breaks.
    StringReturner base64String() const;
    /// The SHA-1 of the bytes in 40 lower-case hexadecimal digits: the form of every identifier
    /// and content hash.
    StringReturner SHA1HashString() const;

    /// Valid as long as the data and, of a `MutableData`, until it changes. Of null, no bytes.
    static Bytes asBytes(const Data* data) { return data ? data->asBytes() : Bytes(); }
    Bytes asBytes() const { return Bytes(view()); }
    std::string_view view() const { return mIsOwned ? std::string_view(mStorage) : mForeign; }
    const void* getBytes() const { return view().data(); }
    std::size_t getLength() const { return view().size(); }

    std::size_t getHash() const override;
    bool isEqual(const PFRefCounted* other) const override;
    /// "<0001ff>", or the first 32 bytes and the length of a longer block: "<0001…> (100 bytes)".
    StringReturner toString() const override;

 protected:
    explicit Data(std::string bytes) : mStorage(std::move(bytes)) {}
    explicit Data(std::string_view foreign) : mIsOwned(false), mForeign(foreign) {}

    bool mIsOwned = true;
    std::string mStorage;       ///< the bytes, if they are owned
    std::string_view mForeign;  ///< the bytes, if they are not
};

}  // namespace Foundation
