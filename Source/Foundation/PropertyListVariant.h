#pragma once

#include "Foundation/Returner.h"

namespace Foundation {

class BusMessage;
class Dictionary;

/// Property lists as arguments of messages.
///
/// A value travels as a variant: a string as "s", a truth value as "b", an integer as "x", a real
/// number as "d", data as "ay", a date as the structure "(d)" of its seconds since 2001, an array
/// as "av", a dictionary, whose keys are strings, as "a{sv}". What cannot travel is left out with a
/// warning: objects of other kinds, null in an array, texts with a zero in them, and what stands
/// deeper than `kMaximumDepth`.
///
/// On arrival the other types of the bus are read as what comes nearest: any integer as a number,
/// object paths and signatures as strings, arrays and dictionaries of other types, keys included,
/// by their elements, structures as arrays. File descriptors are left out with a warning.
struct PropertyListVariant {
    /// How deep collections may be nested. The bus refuses messages of more than 64 levels, and a
    /// dictionary in a dictionary takes three.
    static constexpr int kMaximumDepth = 16;

    /// Appends the dictionary as "a{sv}". No entries stand for null; for an empty dictionary there
    /// is one of the key "" with a signature, which is no value of a property list.
    static void append(BusMessage& message, const Dictionary* dictionary);
    /// Reads such an argument: null for null, an empty dictionary for an empty one. Null, with a
    /// warning, if the next argument is no dictionary.
    static Returner<Dictionary> read(BusMessage& message);
};

}  // namespace Foundation
