#pragma once

#include "Foundation/Array.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Uncopyable.h"

#include <string>
#include <string_view>

namespace Foundation {

class Number;

/// Writes one tree of values as XML.
class PropertyListWriter : Uncopyable {
 public:
    /// Throws `PropertyListError` for what a property list cannot hold. To be called once.
    std::string write(const PFRefCounted* value);

 private:
    void writeValue(const PFRefCounted* value);
    void writeNumber(const Number& number);
    void writeArray(const Array& array);
    void writeDictionary(const Dictionary& dictionary);
    void writeElement(std::string_view name, std::string_view text);
    void openContainer(std::string_view name);
    void closeContainer(std::string_view name);
    void startLine();
    void appendEscaped(std::string_view text);

    std::string mXML;
    std::size_t mDepth = 0;
};

}  // namespace Foundation
