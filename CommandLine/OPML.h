#pragma once

#include "Outline.h"

#include <Orvane/OVDate.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace Commands::OPML {

/// The outlines of a document that are feeds or folders, mended where that is possible; none for a
/// document that has no outline at all. A list of URLs, one a line, is read as well: "#" begins a
/// remark, and what follows a blank is not of the URL.
///
/// Outlines that are neither are left out, and what stands below them moves up. So do those below a
/// depth of `kDepth`.
std::optional<std::vector<Outline>> read(std::string_view document);

/// A document of OPML 2.0.
std::string write(const std::vector<Outline>& outlines, const std::string& title,
                  const OVDate& date);

inline constexpr int kDepth = 32;

}  // namespace Commands::OPML
