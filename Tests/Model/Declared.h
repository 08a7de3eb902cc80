#pragma once

#include <vector>

/// What a table is to be.
struct DeclaredColumn {
    const char* name;
    const char* declaration;
};

/// For each row class: `columns`, and `visit`, which calls `f(position, member)` for each column.
template <class T>
struct Declared;
