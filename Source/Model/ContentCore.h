#pragma once

#include "Foundation/URL.h"
#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

namespace FeedParser {
class Tidier;
}

/// A text or other data with its type: a row of "Contents".
///
/// What comes out of a document is mended when it is read for the first time, and not at all if it
/// never is: most of what a refresh brings is there already and thrown away.
class ContentCore : public CoreOf<ContentCore> {
 public:
    static constexpr const char* kTableName = "Contents";
    static const char kSchema[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Data = 0,
        MIMEType,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    /// The data, which is tidied first if it waits for that; null where there is none, and if it
    /// could not be tidied. Valid until the current pool drains.
    Foundation::Data* getData() const;
    /// The SHA-1 of that in hexadecimal; null for null.
    Foundation::StringReturner getComputedHash() const;
    /// Whether this has more data than the other, which may be null, as both came: neither is
    /// tidied for it. No data is never better.
    bool isBetterThan(const ContentCore* other) const;

    /// Takes over type, data and whether that waits to be tidied.
    void copyFrom(const ContentCore* other);
    /// Lets the data wait to be tidied, by the URL that its links are relative to, which may be
    /// null.
    void tidy(Foundation::URL* base);
    bool needsTidy() const { return mNeedsTidy; }
    /// Puts others in the place of the process's tidiers, for tests; null for the usual ones.
    static void _setTidiers(FeedParser::Tidier* forHTML, FeedParser::Tidier* forXML);

    // By the type. No type counts as plain text.

    bool isXMLString() const;
    bool isPlainTextString() const;
    bool isHTMLString() const;
    bool isTextString() const;

    // Texts of the data. Valid until the current pool drains. Null for data that is not UTF-8.

    /// The text without markup; null for what is neither plain text nor HTML.
    Foundation::String* getPlainTextString() const;
    /// The data as it stands.
    Foundation::String* getRawString() const;
    /// The text as HTML; null for what is neither plain text nor HTML.
    Foundation::String* getHTMLString() const;
    /// What stands in an Atom text construct of type `getAtomType`: the text itself or, with
    /// `asHTML` and unless it is XML, escaped for HTML; base64 for other data.
    Foundation::String* getAtomString(bool asHTML) const;
    /// "text", "xhtml", "html", or the type itself.
    Foundation::String* getAtomType() const;

    /// What was made of the data goes with it.
    void unload() override;
    void _forgetLoaded() override;
    /// The file does not say that data waits to be tidied, so that is done first.
    void saveChanges() override;

    SQLite::ScalarColumn<Foundation::Data> mData{this};  ///< UTF-8 of a text, or raw
    SQLite::ScalarColumn<Foundation::String> mMIMEType{this};

 private:
    void tidyNow();
    void forgetTexts();

    mutable Foundation::Ref<Foundation::String> mPlainText;  ///< null until asked for
    mutable Foundation::Ref<Foundation::String> mHTML;       ///< null until asked for
    bool mNeedsTidy = false;
    Foundation::Ref<Foundation::URL> mTidyBaseURL;
};

/// Whether the two are one row, or agree in type and data. False if one alone is null.
bool IsContentEqual(const ContentCore* a, const ContentCore* b);

}  // namespace Orvane
