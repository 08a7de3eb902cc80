// The process that is killed, for the test that what it has acknowledged is in the file:
//
//   store_committer PATH MODE    commits for ever: in each transaction an item and a group of the
//                                next number, and that number in the first item. Writes the number
//                                once it is committed. With the write-ahead log if the mode is
//                                "wal".

#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "SQLite/TestRows.h"
#include "SQLite/Transaction.h"

#include <unistd.h>

#include <cstdio>
#include <string>

using namespace Foundation;
using namespace SQLite;

namespace {

void open(const char* path, const std::string& mode) {
    Database::initialize();
    gDatabase->open(path, true);
    if (mode == "wal") gDatabase->useWriteAheadLog();
    TableOf<Group>::instance()->create(Group::kSchema, nullptr, nullptr);
    TableOf<Item>::instance()->create(Item::kSchema, nullptr, nullptr);
}

void commit(int number) {
    const AutoreleasePool pool;
    const std::string name = std::to_string(number);
    const Transaction transaction(true);
    Group::make(name.c_str())->saveChanges();
    Item::make(name.c_str())->saveChanges();
    const Ref<Item> first = TableOf<Item>::instance()->rowWithID(1);
    first->mNumber.setValue(number);
    first->saveChanges();
}

bool acknowledge(int number) {
    const std::string line = std::to_string(number) + "\n";
    return write(STDOUT_FILENO, line.data(), line.size()) == static_cast<ssize_t>(line.size());
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 3) return 2;
    const AutoreleasePool pool;
    try {
        open(argv[1], argv[2]);
        int number = gDatabase->execScalar("select count(*) from Items");
        do {
            commit(++number);
        } while (acknowledge(number));
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
    }
    return 1;
}
