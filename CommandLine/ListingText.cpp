#include "ListingText.h"

#include "DateText.h"
#include "TextLayout.h"

#include <algorithm>
#include <cstdio>
#include <iterator>

namespace Commands {

namespace {

using Column = Listing::Column;
using Kind = Listing::Column::Kind;
using Cells = std::vector<std::vector<std::string>>;

constexpr std::size_t kShortest = 7;
constexpr std::size_t kGap = 2;
constexpr std::size_t kNarrowest = 8;  ///< that a flexible column becomes

std::string joined(const std::vector<std::string>& list) {
    std::string all;
    for (const std::string& each : list) {
        all += (all.empty() ? "" : ", ") + each;
    }
    return all;
}

/// `now` is null where dates are for programs.
std::string textOf(const Value& value, const OVDate* now) {
    struct Visitor {
        const OVDate* now;
        std::string operator()(std::monostate) const { return {}; }
        std::string operator()(bool flag) const { return flag ? "yes" : "no"; }
        std::string operator()(long long number) const { return std::to_string(number); }
        std::string operator()(double number) const {
            std::string text = std::to_string(number);
            text.erase(text.find_last_not_of('0') + 1);
            if (text.back() == '.') text.pop_back();
            return text;
        }
        std::string operator()(const std::string& text) const { return TextLayout::clean(text); }
        std::string operator()(const OVDate& date) const {
            return now ? DateText::relative(date, *now) : DateText::iso8601(date);
        }
        std::string operator()(const std::vector<std::string>& list) const {
            return TextLayout::clean(joined(list));
        }
    };
    return std::visit(Visitor{now}, value);
}

std::string sizeText(double bytes) {
    constexpr const char* kUnits[] = {"bytes", "kB", "MB", "GB", "TB"};
    constexpr double kStep = 1000;
    std::size_t unit = 0;
    for (; bytes >= kStep && unit + 1 < std::size(kUnits); ++unit) {
        bytes /= kStep;
    }
    char text[32];
    std::snprintf(text, sizeof text, "%.*f", unit == 0 ? 0 : 1, bytes);
    return std::string(text) + ' ' + kUnits[unit];
}

/// The columns that a text has, by their place.
std::vector<std::size_t> shownColumns(const Listing& listing) {
    std::vector<std::size_t> shown;
    for (std::size_t i = 0; i < listing.columns.size(); ++i) {
        if (listing.columns[i].title[0]) shown.push_back(i);
    }
    return shown;
}

void cutIdentifiers(Cells& cells, std::size_t column) {
    std::vector<std::string> all;
    for (std::size_t row = 1; row < cells.size(); ++row) {
        all.push_back(cells[row][column]);
    }
    const std::size_t length = ListingText::identifierLength(all);
    for (std::size_t row = 1; row < cells.size(); ++row) {
        cells[row][column].resize(std::min(length, cells[row][column].size()));
    }
}

/// All texts of a table, the titles first.
Cells cellsOf(const Listing& listing, const std::vector<std::size_t>& shown, const OVDate& now) {
    Cells cells(1);
    for (const std::size_t column : shown) {
        cells[0].emplace_back(listing.columns[column].title);
    }
    for (const Listing::Row& row : listing.rows) {
        cells.emplace_back();
        for (const std::size_t column : shown) {
            cells.back().push_back(
                ListingText::shown(row.values[column], listing.columns[column].kind, now));
        }
    }
    for (std::size_t i = 0; i < shown.size(); ++i) {
        if (listing.columns[shown[i]].kind == Kind::Identifier) cutIdentifiers(cells, i);
    }
    return cells;
}

std::size_t sumOf(const std::vector<std::size_t>& widths) {
    std::size_t sum = widths.empty() ? 0 : kGap * (widths.size() - 1);
    for (const std::size_t width : widths) {
        sum += width;
    }
    return sum;
}

/// Makes the widest flexible column narrower until the table fits, or all are as narrow as may be.
void shrink(std::vector<std::size_t>& widths, const std::vector<bool>& isFlexible,
            std::size_t available) {
    for (std::size_t sum = sumOf(widths); sum > available; --sum) {
        std::size_t widest = widths.size();
        for (std::size_t i = 0; i < widths.size(); ++i) {
            if (!isFlexible[i] || widths[i] <= kNarrowest) continue;
            if (widest == widths.size() || widths[i] > widths[widest]) widest = i;
        }
        if (widest == widths.size()) return;
        --widths[widest];
    }
}

const char* colourOf(Listing::Style style) {
    switch (style) {
        case Listing::Style::Strong:
            return "\033[1m";
        case Listing::Style::Faint:
            return "\033[2m";
        case Listing::Style::Bad:
            return "\033[31m";
        case Listing::Style::Plain:
            break;
    }
    return "";
}

std::string inColour(const std::string& line, Listing::Style style, bool hasColours) {
    const std::string colour = hasColours ? colourOf(style) : "";
    return colour.empty() ? line : colour + line + "\033[0m";
}

}  // namespace

std::string ListingText::shown(const Value& value, Kind kind, const OVDate& now) {
    const auto* bytes = kind == Kind::Bytes ? std::get_if<long long>(&value) : nullptr;
    return bytes ? sizeText(static_cast<double>(*bytes)) : textOf(value, &now);
}

std::string ListingText::plain(const Value& value) {
    return textOf(value, nullptr);
}

std::size_t ListingText::identifierLength(const std::vector<std::string>& identifiers) {
    std::vector<std::string> sorted = identifiers;
    std::sort(sorted.begin(), sorted.end());
    sorted.erase(std::unique(sorted.begin(), sorted.end()), sorted.end());
    std::size_t length = kShortest;
    for (std::size_t i = 1; i < sorted.size(); ++i) {
        const auto [a, b] = std::mismatch(sorted[i - 1].begin(), sorted[i - 1].end(),
                                          sorted[i].begin(), sorted[i].end());
        length = std::max(length, static_cast<std::size_t>(b - sorted[i].begin()) + 1);
    }
    return length;
}

std::string ListingText::table(const Listing& listing, const Look& look) {
    const std::vector<std::size_t> shown = shownColumns(listing);
    const Cells cells = cellsOf(listing, shown, look.now);
    std::vector<std::size_t> widths(shown.size());
    std::vector<bool> isFlexible;
    for (std::size_t i = 0; i < shown.size(); ++i) {
        for (const auto& row : cells) {
            widths[i] = std::max(widths[i], TextLayout::width(row[i]));
        }
        isFlexible.push_back(listing.columns[shown[i]].kind == Kind::Flexible);
    }
    shrink(widths, isFlexible, look.width);
    std::string text;
    for (std::size_t row = 0; row < cells.size(); ++row) {
        std::string line;
        for (std::size_t i = 0; i < shown.size(); ++i) {
            const bool isNumber = listing.columns[shown[i]].kind == Kind::Number;
            line += TextLayout::pad(TextLayout::fit(cells[row][i], widths[i]), widths[i], isNumber);
            line += std::string(kGap, ' ');
        }
        line.erase(line.find_last_not_of(' ') + 1);
        const auto style = row == 0 ? Listing::Style::Faint : listing.rows[row - 1].style;
        text += inColour(line, style, look.hasColours) + '\n';
    }
    return text;
}

std::string ListingText::lines(const Listing& listing) {
    const std::vector<std::size_t> shown = shownColumns(listing);
    std::string text;
    for (const Listing::Row& row : listing.rows) {
        for (std::size_t i = 0; i < shown.size(); ++i) {
            text += (i == 0 ? "" : "\t") + textOf(row.values[shown[i]], nullptr);
        }
        text += '\n';
    }
    return text;
}

}  // namespace Commands
