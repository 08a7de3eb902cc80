#include "FeedParser/Text/RSSAuthorParser.h"

#include <string_view>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr std::string_view kBlanks("\0\t\n\v\f\r ", 7);

bool isAuthorBlank(char c) {
    return kBlanks.find(c) != std::string_view::npos;
}

/// Adds a character, but no blank behind another.
void append(std::string& buffer, char c) {
    const bool isSecondBlank = isAuthorBlank(c) && !buffer.empty() && isAuthorBlank(buffer.back());
    if (!isSecondBlank) buffer += c;
}

/// Splits an author line, one byte at a time.
class AuthorScanner {
 public:
    void read(char c);

    std::string name;
    std::string email;

 private:
    /// How far the text is. In a word, what makes it an address; in parentheses, how many are open.
    enum State {
        kBetweenWords = 0,  ///< or in a word without "@"
        kBehindAt = 1,
        kBehindDot = 2,
        kInDomain = 3,
        kInBrackets = 5,
        kInQuotes = 6,
        kInParentheses = 10,  ///< and up
    };

    void readInWord(char c);
    void readInParentheses(char c);
    /// What opens something between words. False if `c` does not.
    bool readOpening(char c);
    /// Ends the word, whose blank goes along.
    void endWord(std::string& buffer, char blank);

    int mState = kBetweenWords;
    std::string mWord;
};

void AuthorScanner::read(char c) {
    if (mState == kInBrackets) {
        if (c == '>') {
            mState = kBetweenWords;
        } else if (!isAuthorBlank(c)) {
            append(email, c);
        }
    } else if (mState == kInQuotes) {
        if (c == '"') {
            mState = kBetweenWords;
        } else {
            append(name, c);
        }
    } else if (mState >= kInParentheses) {
        readInParentheses(c);
    } else if (mState != kBetweenWords || !readOpening(c)) {
        readInWord(c);
    }
}

bool AuthorScanner::readOpening(char c) {
    switch (c) {
        case '(':
            mState = kInParentheses;
            return true;
        case '<':
            mState = kInBrackets;
            return true;
        case '"':
            mState = kInQuotes;
            return true;
        default:
            return false;
    }
}

void AuthorScanner::readInWord(char c) {
    if (isAuthorBlank(c)) {
        endWord(mState == kInDomain ? email : name, c);
        return;
    }
    append(mWord, c);
    if (mState == kBehindDot) {
        mState = kInDomain;
    } else if (mState == kBetweenWords && c == '@') {
        mState = kBehindAt;
    } else if (mState == kBehindAt && c == '.') {
        mState = kBehindDot;
    }
}

void AuthorScanner::readInParentheses(char c) {
    if (c == ')' && mState == kInParentheses) {
        mState = kBetweenWords;
        return;
    }
    if (c == '(') ++mState;
    if (c == ')') --mState;
    append(name, c);
}

void AuthorScanner::endWord(std::string& buffer, char blank) {
    mState = kBetweenWords;
    append(mWord, blank);
    for (const char c : mWord) {
        append(buffer, c);
    }
    mWord.clear();
}

StringReturner textOf(std::string text) {
    RSSAuthorParser::trim(text);
    return text.empty() ? nullptr : String::string(std::move(text));
}

}  // namespace

RSSAuthorParser::RSSAuthorParser(const String* text) {
    if (text) parseString(text->utf8().c_str());
}

void RSSAuthorParser::parseString(const char* text) {
    AuthorScanner scanner;
    do {
        scanner.read(*text);
    } while (*text++);
    name = textOf(std::move(scanner.name));
    email = textOf(std::move(scanner.email));
}

void RSSAuthorParser::trim(std::string& text) {
    text.erase(text.find_last_not_of(kBlanks) + 1);
    text.erase(0, text.find_first_not_of(kBlanks));
}

}  // namespace Orvane
