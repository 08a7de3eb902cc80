#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace Commands::NameMatch {

/// What a user can name a thing by.
struct Named {
    std::string identifier;
    std::string url;
    std::string title;
};

/// The fewest characters of an identifier that name something.
inline constexpr std::size_t kShortestPrefix = 7;

/// Whether a name may be the beginning of an identifier.
bool isPrefix(const std::string& name);

/// Which of the things a name means: by the identifier or its beginning, by the URL, by the title
/// or a part of it, without regard to case. The first of these that fits anything decides. Throws
/// `Failure` with `ExitStatus::UnknownName` if none or several are meant; `kind` is what the
/// message calls them.
std::size_t find(const std::string& name, const std::vector<Named>& things, const char* kind);

}  // namespace Commands::NameMatch
