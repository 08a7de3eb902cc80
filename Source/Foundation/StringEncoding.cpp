#include "Foundation/StringEncoding.h"

#include "Foundation/UTF8.h"

#include <unicode/ucnv.h>
#include <unicode/ucnv_cb.h>
#include <cstring>
#include <iterator>
#include <memory>
#include <utility>

namespace Foundation {

namespace {

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

struct CloseConverter {
    void operator()(UConverter* converter) const { ucnv_close(converter); }
};
using Converter = std::unique_ptr<UConverter, CloseConverter>;

// Leave the error as it is, which ends the conversion. ICU's own stop handler passes over
// invisible characters that the target cannot hold.
void stopReading(const void*, UConverterToUnicodeArgs*, const char*, int32_t,
                 UConverterCallbackReason, UErrorCode*) {}
void stopWriting(const void*, UConverterFromUnicodeArgs*, const UChar*, int32_t, UChar32,
                 UConverterCallbackReason, UErrorCode*) {}

/// ICU's own replacement for a single byte is a control character.
void replaceReading(const void*, UConverterToUnicodeArgs* args, const char*, int32_t,
                    UConverterCallbackReason reason, UErrorCode* status) {
    if (reason > UCNV_IRREGULAR) return;
    constexpr UChar kReplacement = 0xFFFD;
    *status = U_ZERO_ERROR;
    ucnv_cbToUWriteUChars(args, &kReplacement, 1, 0, status);
}

/// What a conversion does about what it cannot read.
enum class Otherwise { Stop, Replace };

/// `bytes` from one encoding in another; none if that cannot be done.
std::optional<std::string> convert(const char* from, const char* to, std::string_view bytes,
                                   Otherwise otherwise = Otherwise::Stop) {
    if (bytes.empty()) return std::string();
    UErrorCode status = U_ZERO_ERROR;
    const Converter source(ucnv_open(from, &status));
    const Converter target(ucnv_open(to, &status));
    const UConverterToUCallback reading =
        otherwise == Otherwise::Stop ? stopReading : replaceReading;
    ucnv_setToUCallBack(source.get(), reading, nullptr, nullptr, nullptr, &status);
    ucnv_setFromUCallBack(target.get(), stopWriting, nullptr, nullptr, nullptr, &status);
    if (U_FAILURE(status)) return std::nullopt;

    std::string result;
    char chunk[4096];
    UChar pivot[2048];
    UChar* pivotSource = pivot;
    UChar* pivotTarget = pivot;
    const char* in = bytes.data();
    UBool isFirst = 1;
    do {
        char* out = chunk;
        status = U_ZERO_ERROR;
        ucnv_convertEx(target.get(), source.get(), &out, std::end(chunk), &in, in + bytes.size(),
                       pivot, &pivotSource, &pivotTarget, std::end(pivot), isFirst, true, &status);
        result.append(chunk, out);
        bytes.remove_prefix(static_cast<std::size_t>(in - bytes.data()));
        isFirst = 0;
    } while (status == U_BUFFER_OVERFLOW_ERROR);
    if (U_FAILURE(status)) return std::nullopt;
    return result;
}

}  // namespace

std::optional<StringEncoding> StringEncoding::named(const char* name) {
    if (!name) return std::nullopt;
    UErrorCode status = U_ZERO_ERROR;
    // Only names of the table: to open another would look for a file of that name.
    if (ucnv_countAliases(name, &status) == 0 || U_FAILURE(status)) return std::nullopt;
    for (const char* standard : {"MIME", "IANA"}) {
        status = U_ZERO_ERROR;
        const char* known = ucnv_getStandardName(name, standard, &status);
        if (known && U_SUCCESS(status)) return StringEncoding(known);
    }
    status = U_ZERO_ERROR;
    const char* known = ucnv_getAlias(name, 0, &status);
    return known && U_SUCCESS(status) ? std::optional(StringEncoding(known)) : std::nullopt;
}

bool StringEncoding::operator==(const StringEncoding& other) const {
    return std::strcmp(mName, other.mName) == 0;
}

std::optional<std::string> StringEncoding::decode(std::string_view bytes) const {
    std::optional<std::string> text;
    if (*this != kUTF8) {
        text = convert(mName, kUTF8.mName, bytes);
    } else if (UTF8::isValid(bytes)) {
        text = bytes;
    }
    if (text && text->starts_with(kByteOrderMark)) text->erase(0, kByteOrderMark.size());
    return text;
}

std::string StringEncoding::decodeLeniently(std::string_view bytes) const {
    if (std::optional<std::string> text = decode(bytes)) return std::move(*text);
    std::string text = convert(mName, kUTF8.mName, bytes, Otherwise::Replace).value_or("");
    if (text.starts_with(kByteOrderMark)) text.erase(0, kByteOrderMark.size());
    return text;
}

std::optional<std::string> StringEncoding::encode(std::string_view utf8) const {
    if (*this == kUTF8) return std::string(utf8);
    return convert(kUTF8.mName, mName, utf8);
}

}  // namespace Foundation
