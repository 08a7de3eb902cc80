#pragma once

#include "Foundation/Data.h"

#include <cstddef>

namespace Foundation {

/// A block of bytes that can grow. Made by `Data::mutableData`.
class MutableData : public Data {
 public:
    /// Adds a copy of the bytes, which may be this data's own.
    void append(Bytes bytes) { mStorage.append(bytes.view()); }
    /// Adds a copy of the bytes of `data`, which may be null or this.
    void append(const Data* data) { append(asBytes(data)); }
    /// Makes room for so many bytes in all, so that what is added does not move.
    void reserve(std::size_t length) { mStorage.reserve(length); }
    /// Cuts the data, or fills it up with zeros.
    void setLength(std::size_t length) { mStorage.resize(length); }

    /// Where the bytes can be written. Valid until the length changes.
    void* getMutableBytes() { return mStorage.data(); }

 private:
    friend class Data;
    explicit MutableData(std::size_t room) : Data(std::string()) { mStorage.reserve(room); }
    explicit MutableData(Bytes bytes) : Data(std::string(bytes.view())) {}
};

}  // namespace Foundation
