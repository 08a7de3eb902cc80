#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/Schema.h"
#include "SQLite/CursorOf.h"
#include "SQLite/TableOf.h"
#include "Support/TempDir.h"

#include <fmt/format.h>
#include <sqlite3.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// What do rows cost, next to sqlite3 with the same statements? Both sides have a file of their own
/// with the same tables and settings, in a connection without locks. Neither waits for the disk,
/// and no change is announced: only the work of the row store is to differ.
///
/// sqlite3 alone reads every column of every row, in the type it has, into a row of its own:
/// numbers as they are and a copy of the bytes of each text and zone, as what sqlite3 gives is gone
/// with the next step. It checks no text, and gives the row up before it reads the next one. The
/// row store does the same and hands out the row as an object, of which one text is asked for.

using namespace Benchmarks;
using namespace Foundation;
using Orvane::EntryCore;
using SQLite::CursorOf;
using SQLite::gDatabase;
using SQLite::TableOf;

namespace {

constexpr int kRows = 100'000;
constexpr int kRounds = 5;

constexpr const char* kEmpty = "DELETE FROM Entries";
constexpr const char* kDoNotWait = "PRAGMA synchronous = OFF";
constexpr const char* kWalked = "rowID>0";

/// How the 28 columns behind "rowID" are stored: texts, integers, dates and the names of zones.
constexpr std::string_view kColumnKinds = "ttttitititdbdbdbttiiiiiidddd";

constexpr std::size_t countOf(char kind) {
    return static_cast<std::size_t>(std::count(kColumnKinds.begin(), kColumnKinds.end(), kind));
}

/// The values of one entry, as texts for sqlite3 and as objects for the rows, so that making them
/// counts for neither side.
struct Sample {
    explicit Sample(int number)
        : identifier(fmt::format("{:040x}", number * 2654435761U)),
          id(fmt::format("tag:example.org,2006:entry-{}", number)),
          title(fmt::format("The title of entry {} of a feed", number)),
          hash(fmt::format("{:040x}", number)),
          link(fmt::format("http://www.example.org/articles/2006/entry-{}.html", number)),
          date(160'000'000.5 + number),
          isRead(number % 3 == 0),
          identifierString(String::string(identifier)),
          idString(String::string(id)),
          titleString(String::string(title)),
          hashString(String::string(hash)),
          url(URL::url(Ref<String>(String::string(link)).get())),
          dateObject(Date::date(date)) {}

    std::string identifier, id, title, hash, link;
    double date;
    bool isRead;
    Ref<String> identifierString, idString, titleString, hashString;
    Ref<URL> url;
    Ref<Date> dateObject;
};

/// What all entries have in common: the rows that they point at, which are only IDs here.
struct Common {
    Ref<TimeZone> zone{TimeZone::fixedZone(3600)};
    Ref<Orvane::ContentCore> content{TableOf<Orvane::ContentCore>::instance()->rowWithID(1)};
    Ref<Orvane::AuthorCore> author{TableOf<Orvane::AuthorCore>::instance()->rowWithID(1)};
    Ref<Orvane::FeedCore> feed{TableOf<Orvane::FeedCore>::instance()->rowWithID(1)};
};

void fill(EntryCore& row, const Sample& sample, const Common& common) {
    row.mIdentifier.setValue(sample.identifierString.get());
    row.mID.setValue(sample.idString.get());
    row.mTitle.setValue(sample.titleString.get());
    row.mContent.setValue(common.content.get());
    row.mContentHash.setValue(sample.hashString.get());
    row.mXMLRepresentation.setValue(common.content.get());
    row.mXMLRepresentationHash.setValue(sample.hashString.get());
    row.mDateUpdated.setValue(sample.dateObject.get());
    row.mTimeZoneUpdated.setValue(common.zone.get());
    row.mDatePublished.setValue(sample.dateObject.get());
    row.mTimeZonePublished.setValue(common.zone.get());
    row.mAlternateURL.setValue(sample.url.get());
    row.mAuthor.setValue(common.author.get());
    row.mFeed.setValue(common.feed.get());
    row.mCurrent.setValue(true);
    row.mRead.setValue(sample.isRead);
    row.mLocalDateCreated.setValue(sample.dateObject.get());
    row.mLocalDateUpdated.setValue(sample.dateObject.get());
    row.mLocalDateXMLChanged.setValue(sample.dateObject.get());
}

void insertRows(const std::vector<Sample>& samples, const Common& common) {
    for (const Sample& sample : samples) {
        const AutoreleasePool pool;
        const Ref<EntryCore> row = Returner<EntryCore>::adopted(new EntryCore);
        fill(*row, sample, common);
        row->addToTable(TableOf<EntryCore>::instance());
    }
    gDatabase->saveRows();
}

void faultRows() {
    for (int i = 1; i <= kRows; ++i) {
        const AutoreleasePool pool;
        const Ref<EntryCore> row = TableOf<EntryCore>::instance()->rowWithID(i);
        keep(row->mTitle.getValue());
    }
}

void walkRows() {
    CursorOf<EntryCore> cursor(TableOf<EntryCore>::instance()->rowsWhere(kWalked));
    for (; cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        const Ref<EntryCore> row = cursor.row();
        keep(row->mTitle.getValue());
    }
}

/// An entry as a program without a row store would have it.
struct PlainRow {
    long long rowID = 0;
    std::array<std::string, countOf('t') + countOf('b')> texts;
    std::array<long long, countOf('i')> integers;
    std::array<double, countOf('d')> dates;
};

/// The same with nothing around sqlite3.
class PlainStore {
 public:
    explicit PlainStore(const std::string& path) {
        check(sqlite3_open_v2(path.c_str(), &mDB, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX,
                              nullptr));
        check(sqlite3_extended_result_codes(mDB, 1));
        check(sqlite3_db_config(mDB, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr));
        check(sqlite3_db_config(mDB, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr));
        run("PRAGMA cell_size_check = ON");
        run("PRAGMA temp_store = MEMORY");
        run(kDoNotWait);
        mInsert = compile(EntryCore::columnList().insertText(EntryCore::kTableName).c_str());
        mFault = compile("SELECT * FROM Entries WHERE rowID=?");
        mWalk = compile(fmt::format("SELECT * FROM Entries WHERE {}", kWalked).c_str());
    }
    ~PlainStore() {
        for (sqlite3_stmt* statement : {mInsert, mFault, mWalk})
            sqlite3_finalize(statement);
        sqlite3_close(mDB);
    }
    PlainStore(const PlainStore&) = delete;
    PlainStore& operator=(const PlainStore&) = delete;

    void run(const char* sql) { check(sqlite3_exec(mDB, sql, nullptr, nullptr, nullptr)); }

    void insertRows(const std::vector<Sample>& samples, const std::string& zone) {
        run("begin immediate transaction");
        for (const Sample& sample : samples) {
            bind(sample, zone);
            finish(mInsert);
        }
        run("commit");
    }
    void faultRows() {
        for (int i = 1; i <= kRows; ++i) {
            check(sqlite3_bind_int64(mFault, 1, i));
            if (sqlite3_step(mFault) != SQLITE_ROW) throw std::runtime_error("a row is missing");
            readRow(mFault);
            check(sqlite3_reset(mFault));
        }
    }
    void walkRows() {
        int count = 0;
        for (; sqlite3_step(mWalk) == SQLITE_ROW; ++count)
            readRow(mWalk);
        check(sqlite3_reset(mWalk));
        if (count != kRows) throw std::runtime_error("rows are missing");
    }

 private:
    void check(int result) const {
        if (result != SQLITE_OK) throw std::runtime_error(sqlite3_errmsg(mDB));
    }
    sqlite3_stmt* compile(const char* sql) {
        sqlite3_stmt* statement = nullptr;
        check(sqlite3_prepare_v2(mDB, sql, -1, &statement, nullptr));
        return statement;
    }
    void finish(sqlite3_stmt* statement) {
        const int result = sqlite3_step(statement);
        check(result == SQLITE_DONE ? sqlite3_reset(statement) : result);
    }

    void bind(const Sample& sample, const std::string& zone) {
        bindTexts(sample);
        for (const int column : {EntryCore::Content, EntryCore::XMLRepresentation,
                                 EntryCore::Author, EntryCore::Feed, EntryCore::Current})
            check(sqlite3_bind_int64(mInsert, column + 1, 1));
        for (const int column : {EntryCore::Summary, EntryCore::Tombstone, EntryCore::Flagged})
            check(sqlite3_bind_int64(mInsert, column + 1, 0));
        check(sqlite3_bind_int64(mInsert, EntryCore::Read + 1, sample.isRead ? 1 : 0));
        for (const int column :
             {EntryCore::DateUpdated, EntryCore::DatePublished, EntryCore::LocalDateCreated,
              EntryCore::LocalDateUpdated, EntryCore::LocalDateXMLChanged})
            check(sqlite3_bind_double(mInsert, column + 1, sample.date));
        for (const int column : {EntryCore::DateCreated, EntryCore::LocalDateFlagsUpdated})
            check(sqlite3_bind_double(mInsert, column + 1, 0));
        for (const int column : {EntryCore::TimeZoneUpdated, EntryCore::TimeZonePublished})
            check(sqlite3_bind_blob(mInsert, column + 1, zone.data(), static_cast<int>(zone.size()),
                                    SQLITE_STATIC));
        for (const int column : {EntryCore::Rights, EntryCore::SummaryHash,
                                 EntryCore::TimeZoneCreated, EntryCore::BaseURL})
            check(sqlite3_bind_null(mInsert, column + 1));
    }
    void bindTexts(const Sample& sample) {
        bindText(EntryCore::Identifier, sample.identifier);
        bindText(EntryCore::ID, sample.id);
        bindText(EntryCore::Title, sample.title);
        bindText(EntryCore::ContentHash, sample.hash);
        bindText(EntryCore::XMLRepresentationHash, sample.hash);
        bindText(EntryCore::AlternateURL, sample.link);
    }
    void bindText(int column, const std::string& text) {
        check(sqlite3_bind_text(mInsert, column + 1, text.data(), static_cast<int>(text.size()),
                                SQLITE_STATIC));
    }

    static void readRow(sqlite3_stmt* statement) {
        PlainRow row;
        int column = 0;
        row.rowID = sqlite3_column_int64(statement, column);
        auto text = row.texts.begin();
        auto integer = row.integers.begin();
        auto date = row.dates.begin();
        for (const char kind : kColumnKinds) {
            ++column;
            switch (kind) {
                case 'i':
                    *integer++ = sqlite3_column_int64(statement, column);
                    break;
                case 'd':
                    *date++ = sqlite3_column_double(statement, column);
                    break;
                case 't':
                    copy(sqlite3_column_text(statement, column), statement, column, *text++);
                    break;
                default:
                    copy(sqlite3_column_blob(statement, column), statement, column, *text++);
            }
        }
        keep(row);
    }
    static void copy(const void* bytes, sqlite3_stmt* statement, int column, std::string& target) {
        if (!bytes) return;
        const int count = sqlite3_column_bytes(statement, column);
        target.assign(static_cast<const char*>(bytes), static_cast<std::size_t>(count));
    }

    sqlite3* mDB = nullptr;
    sqlite3_stmt* mInsert = nullptr;
    sqlite3_stmt* mFault = nullptr;
    sqlite3_stmt* mWalk = nullptr;
};

/// Opens the process's database, and leaves an empty copy of its file for the other side.
void makeFiles(const std::string& path, const std::string& plainPath) {
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Orvane::Schema::createDatabase();
    gDatabase->execute(
        "INSERT INTO Feeds (rowID, url, localDateCreatedOfNewestEntry) "
        "VALUES (1, 'http://www.example.org/', 0)");
    gDatabase->close(true);
    std::filesystem::copy_file(path, plainPath);
    gDatabase->open(path.c_str(), true);
    gDatabase->executeText(SQLite::SQLText(kDoNotWait));
}

/// That both sides have done the same.
void requireSameRows(const std::string& plainPath) {
    gDatabase->execute("ATTACH '%q' AS plain", plainPath.c_str());
    const int count = gDatabase->execScalar("SELECT count(*) FROM Entries");
    const int different = gDatabase->execScalar(
        "SELECT count(*) FROM (SELECT * FROM main.Entries EXCEPT SELECT * FROM plain.Entries)");
    gDatabase->execute("DETACH plain");
    if (count != kRows || different != 0) throw std::runtime_error("the files differ");
}

void measure(const std::string& plainPath) {
    PlainStore plain(plainPath);
    const Common common;
    std::vector<Sample> samples;
    for (int i = 0; i < kRows; ++i) {
        const AutoreleasePool pool;
        samples.emplace_back(i);
    }
    const std::string zone = common.zone->getName();
    const Comparison insert = compare([&] { insertRows(samples, common); },
                                      [&] { plain.insertRows(samples, zone); }, kRounds,
                                      [&] {
                                          gDatabase->executeText(SQLite::SQLText(kEmpty));
                                          plain.run(kEmpty);
                                      });
    report("insert a row of 28 columns", insert, kRows, "sqlite3");
    requireSameRows(plainPath);
    const Comparison fault = compare(
        faultRows, [&] { plain.faultRows(); }, kRounds);
    report("read a row by its ID", fault, kRows, "sqlite3");
    const Comparison walk = compare(
        walkRows, [&] { plain.walkRows(); }, kRounds);
    report("read a row of a query", walk, kRows, "sqlite3");
    std::printf("store_insert %.2f\n", insert.ratio());
    std::printf("store_fault %.2f\n", fault.ratio());
    std::printf("store_walk %.2f\n", walk.ratio());
}

}  // namespace

int main() try {
    const AutoreleasePool pool;
    const Support::TempDir directory;
    const std::string plainPath = directory / "Plain.sqlite3";
    makeFiles(directory / "Database.sqlite3", plainPath);
    measure(plainPath);
    gDatabase->close(true);
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "store_benchmark: %s\n", exception.what());
    return 1;
}
