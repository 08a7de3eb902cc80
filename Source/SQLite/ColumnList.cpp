#include "SQLite/ColumnList.h"

#include "Foundation/AssertionFailure.h"

#include <string>

namespace SQLite {

ColumnList::ColumnList(std::initializer_list<ColumnSpec> columns)
    : mColumns(new std::vector<ColumnSpec>), mToMany(new std::vector<ColumnSpec>) {
    for (const ColumnSpec& column : columns) {
        (column.name ? mColumns : mToMany)->push_back(column);
    }
    OV_ASSERT(mColumns->size() <= kMostColumns);
}

SQLText ColumnList::insertText(const char* table) const {
    std::string names;
    std::string marks;
    for (const ColumnSpec& column : *mColumns) {
        const char* separator = names.empty() ? "" : ", ";
        names.append(separator).append(column.name);
        marks.append(separator).append("?");
    }
    return SQLText::format("insert into %s (%s) values (%s)", table, names, marks);
}

}  // namespace SQLite
