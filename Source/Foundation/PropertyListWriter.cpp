#include "Foundation/PropertyListWriter.h"

#include "Foundation/Base64.h"
#include "Foundation/Data.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/Number.h"
#include "Foundation/PropertyList.h"
#include "Foundation/PropertyListError.h"
#include "Foundation/PropertyListScalars.h"
#include "Foundation/String.h"
#include "Foundation/TypeName.h"

namespace Foundation {

namespace {

/// Whether the character that starts at `place` is one that XML 1.0 cannot hold.
bool isForbidden(std::string_view text, std::size_t place) {
    const auto c = static_cast<unsigned char>(text[place]);
    if (c < 0x20) return c != '\t' && c != '\n' && c != '\r';
    const std::string_view three = text.substr(place, 3);
    return three == "\xEF\xBF\xBE" || three == "\xEF\xBF\xBF";
}

}  // namespace

std::string PropertyListWriter::write(const PFRefCounted* value) {
    mXML = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<plist version=\"1.0\">\n";
    writeValue(value);
    mXML += "</plist>\n";
    return std::move(mXML);
}

void PropertyListWriter::writeValue(const PFRefCounted* value) {
    if (!value) throw PropertyListError("null cannot be written");
    if (const auto* string = dynamic_cast<const String*>(value)) {
        writeElement("string", string->view());
    } else if (const auto* number = dynamic_cast<const Number*>(value)) {
        writeNumber(*number);
    } else if (const auto* dictionary = dynamic_cast<const Dictionary*>(value)) {
        writeDictionary(*dictionary);
    } else if (const auto* array = dynamic_cast<const Array*>(value)) {
        writeArray(*array);
    } else if (const auto* data = dynamic_cast<const Data*>(value)) {
        writeElement("data", Base64::encode(data->view()));
    } else if (const auto* date = dynamic_cast<const Date*>(value)) {
        writeElement("date", PropertyListScalars::writeDate(*date));
    } else {
        throw PropertyListError(OVFormat("a %s cannot be written", getTypeName(typeid(*value))));
    }
}

void PropertyListWriter::writeNumber(const Number& number) {
    switch (number.getKind()) {
        case Number::Kind::Bool:
            startLine();
            mXML += number.getBool() ? "<true/>\n" : "<false/>\n";
            break;
        case Number::Kind::Integer:
            writeElement("integer", std::to_string(number.getInteger()));
            break;
        case Number::Kind::Real:
            writeElement("real", PropertyListScalars::writeReal(number.getReal()));
            break;
    }
}

void PropertyListWriter::writeArray(const Array& array) {
    openContainer("array");
    for (std::size_t i = 0; i < array.count(); ++i) {
        writeValue(array.getAs<PFRefCounted>(i));
    }
    closeContainer("array");
}

void PropertyListWriter::writeDictionary(const Dictionary& dictionary) {
    openContainer("dict");
    for (const auto [key, value] : dictionary) {
        const auto* string = dynamic_cast<const String*>(key);
        if (!string) throw PropertyListError(OVFormat("the key %@ is no string", key));
        writeElement("key", string->view());
        writeValue(value);
    }
    closeContainer("dict");
}

void PropertyListWriter::writeElement(std::string_view name, std::string_view text) {
    startLine();
    mXML.append("<").append(name).append(">");
    appendEscaped(text);
    mXML.append("</").append(name).append(">\n");
}

void PropertyListWriter::openContainer(std::string_view name) {
    // Also the end of a container that holds itself.
    if (mDepth == PropertyList::kMaxDepth) throw PropertyListError("too deep");
    startLine();
    mXML.append("<").append(name).append(">\n");
    ++mDepth;
}

void PropertyListWriter::closeContainer(std::string_view name) {
    --mDepth;
    startLine();
    mXML.append("</").append(name).append(">\n");
}

void PropertyListWriter::startLine() {
    mXML.append(mDepth, '\t');
}

void PropertyListWriter::appendEscaped(std::string_view text) {
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (isForbidden(text, i)) {
            throw PropertyListError("a text holds a character that XML cannot hold: \"" +
                                    std::string(text.substr(0, i)) + "\" and then it");
        }
        switch (text[i]) {
            case '&':
                mXML += "&amp;";
                break;
            case '<':
                mXML += "&lt;";
                break;
            case '>':
                mXML += "&gt;";
                break;
            case '\r':  // as it stands it would read as a line feed
                mXML += "&#13;";
                break;
            default:
                mXML += text[i];
        }
    }
}

}  // namespace Foundation
