#include "RowFormat.h"

#include "Failure.h"
#include "ListingText.h"
#include "Suggestion.h"

#include <optional>

namespace Commands {

namespace {

/// A piece of a format: a text, or the column whose value stands there.
struct Piece {
    std::string text;
    std::optional<std::size_t> column;
};

std::size_t columnOf(const std::string& key, const Listing& listing) {
    std::vector<std::string> keys;
    std::string all;
    for (std::size_t i = 0; i < listing.columns.size(); ++i) {
        if (key == listing.columns[i].key) return i;
        keys.emplace_back(listing.columns[i].key);
        all += (all.empty() ? "" : ", ") + keys.back();
    }
    const std::string close = Suggestion::closest(key, keys);
    throw Failure(ExitStatus::Usage,
                  "--format knows no {" + key + "}" +
                      (close.empty() ? "; there are " + all : "; did you mean {" + close + "}?"));
}

char escaped(char c) {
    switch (c) {
        case 'n':
            return '\n';
        case 't':
            return '\t';
        default:
            return c;
    }
}

std::vector<Piece> piecesOf(const std::string& format, const Listing& listing) {
    std::vector<Piece> pieces(1);
    for (std::size_t i = 0; i < format.size(); ++i) {
        const bool hasNext = i + 1 < format.size();
        if (format[i] == '\\' && hasNext) {
            pieces.back().text += escaped(format[++i]);
        } else if (format[i] == '{' && hasNext && format[i + 1] == '{') {
            pieces.back().text += format[++i];
        } else if (format[i] == '{') {
            const std::size_t end = format.find('}', i);
            if (end == std::string::npos) {
                throw Failure(ExitStatus::Usage, "--format has a { without its }");
            }
            pieces.push_back({{}, columnOf(format.substr(i + 1, end - i - 1), listing)});
            pieces.emplace_back();
            i = end;
        } else {
            pieces.back().text += format[i];
        }
    }
    return pieces;
}

}  // namespace

std::string RowFormat::expand(const std::string& format, const Listing& listing) {
    const std::vector<Piece> pieces = piecesOf(format, listing);
    std::string text;
    for (const Listing::Row& row : listing.rows) {
        for (const Piece& piece : pieces) {
            text += piece.column ? ListingText::plain(row.values[*piece.column]) : piece.text;
        }
        text += '\n';
    }
    return text;
}

}  // namespace Commands
