// The process that writes, for the tests of how the others learn of it:
//
//   store_writer PATH STEP...    takes the agent's name, opens the file and does the steps in one
//                                transaction, then says what went wrong, if anything did
//
//   make NAME      saves a new group and a new item of that name
//   rename NAME    renames all groups and items
//   delete ID      deletes the group and the item of that ID
//   leave NAME     makes a new item and leaves it to the end of the process to save it
//   abort          rolls all steps back, and gives up what is not saved

#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "SQLite/Database.h"
#include "SQLite/TestRows.h"
#include "SQLite/Transaction.h"

#include <cstdio>
#include <cstdlib>
#include <stdexcept>
#include <string>

using namespace Foundation;
using namespace SQLite;

namespace {

void make(const char* name) {
    Group::make(name)->saveChanges();
    Item::make(name)->saveChanges();
}

template <class T, class Column>
void renameAll(Column T::*column, const std::string& name) {
    const Ref<ArrayOf<T>> rows = TableOf<T>::instance()->allRows()->allRows();
    for (T* row : *rows) {
        const Ref<String> text = String::string(name + std::to_string(row->getRowID()));
        (row->*column).setValue(text.get());
        row->saveChanges();
    }
}

template <class T>
void deleteRow(RowID rowID) {
    const Ref<T> row = TableOf<T>::instance()->rowWithID(rowID);
    row->deleteRow();
}

void step(const std::string& command, const char* argument) {
    const AutoreleasePool pool;
    if (command == "make") {
        make(argument);
    } else if (command == "rename") {
        renameAll(&Group::mName, argument);
        renameAll(&Item::mTitle, argument);
    } else if (command == "delete") {
        deleteRow<Group>(std::atoll(argument));
        deleteRow<Item>(std::atoll(argument));
    } else if (command == "leave") {
        Item::make(argument)->addToTable(TableOf<Item>::instance());
        gDatabase->saveRowsSoon();
    } else {
        throw std::runtime_error("rolled back: " + command);
    }
}

void write(const char* path, int count, char** steps) {
    const AutoreleasePool pool;
    Database::initialize();
    gDatabase->open(path, true);
    TableOf<Group>::instance()->create(Group::kSchema, nullptr, nullptr);
    TableOf<Item>::instance()->create(Item::kSchema, nullptr, nullptr);
    gDatabase->setPostsNotifications(true);
    const Transaction transaction(true);
    for (int i = 0; i < count; i += 2) {
        step(steps[i], i + 1 < count ? steps[i + 1] : "");
    }
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2 || !Bus::user().requestName(BusCenter::kAgentName)) return 2;
    try {
        write(argv[1], argc - 2, argv + 2);
    } catch (const std::exception& exception) {
        std::printf("%s\n", exception.what());
        gDatabase->close(false);
    }
    return Bus::user().flush(60) ? 0 : 1;
}
