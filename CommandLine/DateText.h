#pragma once

#include <Orvane/OVDate.h>

#include <string>

namespace Commands::DateText {

/// This moment.
OVDate now();

/// "2026-11-21T23:03:29Z"
std::string iso8601(const OVDate& date);

/// As people say it: "just now", "5 min ago", "in 3 h", "yesterday", "4 days ago", and the day in
/// the local zone for what is a week away or more.
std::string relative(const OVDate& date, const OVDate& now);

/// The point in time that a user names: a day ("2026-11-21", from its start in the local zone), a
/// time of a day ("2026-11-21T23:03", with ":29" and with "Z" for UTC), "now", "today",
/// "yesterday", or how long ago it is: "90min", "12h", "3d", "2w" or "3 days". Throws `Failure`
/// with `ExitStatus::Usage` for anything else.
OVDate parse(const std::string& text, const OVDate& now);

/// Seconds as "30 min", "12 h", "14 days", in the largest unit that leaves no rest.
std::string duration(double seconds);

/// How many seconds a text such as "90", "30min", "12h", "14d" or "2 weeks" stands for. Throws as
/// above.
double parseDuration(const std::string& text);

}  // namespace Commands::DateText
