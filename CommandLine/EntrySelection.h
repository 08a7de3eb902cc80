#pragma once

#include "Arguments.h"

#include <Orvane/OVClient.h>

#include <vector>

/// The options that choose entries, which several verbs have.
namespace Commands::EntrySelection {

std::vector<OptionSpec> options();

/// Whether any of them was given.
bool isGiven(const Arguments& arguments);

/// What they ask for. Throws `Failure` for a feed that there is not, and for a date that is none.
OVEntryQuery query(const Arguments& arguments, const OVClient& client);

}  // namespace Commands::EntrySelection
