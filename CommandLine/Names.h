#pragma once

#include <Orvane/OVClient.h>

#include <memory>
#include <string>
#include <vector>

/// The feeds and entries that words of the command line name: see `NameMatch`. They throw `Failure`
/// with `ExitStatus::UnknownName` for a word that names none or several.
namespace Commands::Names {

std::shared_ptr<OVFeed> feed(const OVClient& client, const std::string& name);
std::vector<std::shared_ptr<OVFeed>> feeds(const OVClient& client,
                                           const std::vector<std::string>& names);

std::shared_ptr<OVEntry> entry(const OVClient& client, const std::string& name);
OVEntry::List entries(const OVClient& client, const std::vector<std::string>& names);

/// What a feed is called: its title, or its URL before it has one.
std::string titleOf(const OVFeed& feed);

}  // namespace Commands::Names
