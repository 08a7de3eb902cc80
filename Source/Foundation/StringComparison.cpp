#include "Foundation/StringComparison.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/ICUText.h"
#include "Foundation/String.h"

#include <unicode/ubrk.h>
#include <unicode/ucol.h>
#include <unicode/usearch.h>
#include <memory>

namespace Foundation {

namespace {

template <auto close>
struct Closer {
    template <class T>
    void operator()(T* object) const {
        close(object);
    }
};
using Collator = std::unique_ptr<UCollator, Closer<ucol_close>>;
using BreakIterator = std::unique_ptr<UBreakIterator, Closer<ubrk_close>>;
using Search = std::unique_ptr<UStringSearch, Closer<usearch_close>>;

void check(UErrorCode status, const char* what) {
    OV_ASSERT_MESSAGE(U_SUCCESS(status), "%s failed: %s", what, u_errorName(status));
}

/// Compares as the options say, by the root locale's order. The levels of that order are letters,
/// then diacritics, then case.
Collator openCollator(CompareOptions options) {
    const bool overlooksCase = options & CompareOptions::CaseInsensitive;
    const bool overlooksDiacritics = options & CompareOptions::DiacriticInsensitive;
    UErrorCode status = U_ZERO_ERROR;
    Collator collator(ucol_open("", &status));
    check(status, "ucol_open");
    const auto set = [&](UColAttribute attribute, UColAttributeValue value) {
        ucol_setAttribute(collator.get(), attribute, value, &status);
    };
    set(UCOL_NORMALIZATION_MODE, UCOL_ON);
    set(UCOL_STRENGTH, overlooksDiacritics ? UCOL_PRIMARY
                       : overlooksCase     ? UCOL_SECONDARY
                                           : UCOL_TERTIARY);
    if (overlooksDiacritics && !overlooksCase) set(UCOL_CASE_LEVEL, UCOL_ON);
    if (options & CompareOptions::Numeric) set(UCOL_NUMERIC_COLLATION, UCOL_ON);
    check(status, "ucol_setAttribute");
    return collator;
}

UCollationResult collate(const UCollator* collator, const icu::UnicodeString& a,
                         const icu::UnicodeString& b) {
    return ucol_strcoll(collator, a.getBuffer(), a.length(), b.getBuffer(), b.length());
}

int sign(int value) {
    return (value > 0) - (value < 0);
}

}  // namespace

int Compare(const String* a, const String* b, CompareOptions options) {
    if (!a || !b) return (a != nullptr) - (b != nullptr);
    if (options == CompareOptions::None) return sign(a->view().compare(b->view()));
    if (options == CompareOptions::CaseInsensitive) {
        return sign(ICUText::foldCase(a->view()).compare(ICUText::foldCase(b->view())));
    }
    return collate(openCollator(options).get(), ICUText::wide(a->view()), ICUText::wide(b->view()));
}

std::optional<TextRange> findWordInText(std::string_view text, std::string_view word,
                                        CompareOptions options, bool wholeWord) {
    if (text.empty() || word.empty()) return std::nullopt;
    const icu::UnicodeString wideText = ICUText::wide(text);
    const icu::UnicodeString wideWord = ICUText::wide(word);
    const Collator collator = openCollator(options);
    UErrorCode status = U_ZERO_ERROR;
    const BreakIterator words(
        wholeWord ? ubrk_open(UBRK_WORD, "", wideText.getBuffer(), wideText.length(), &status)
                  : nullptr);
    const Search search(usearch_openFromCollator(wideWord.getBuffer(), wideWord.length(),
                                                 wideText.getBuffer(), wideText.length(),
                                                 collator.get(), words.get(), &status));
    check(status, "usearch_openFromCollator");
    for (int32_t start = usearch_first(search.get(), &status);
         start != USEARCH_DONE && U_SUCCESS(status); start = usearch_next(search.get(), &status)) {
        const int32_t length = usearch_getMatchedLength(search.get());
        // A search knows no level for case alone, so what it finds is compared once more.
        const icu::UnicodeString found = wideText.tempSubString(start, length);
        if (length == 0 || collate(collator.get(), found, wideWord) != UCOL_EQUAL) continue;
        return TextRange{static_cast<std::size_t>(wideText.countChar32(0, start)),
                         static_cast<std::size_t>(wideText.countChar32(start, length))};
    }
    return std::nullopt;
}

}  // namespace Foundation
