#pragma once

#include <functional>
#include <string>
#include <vector>

/// A document that was made to cost far more than its size, of up to 1 MiB unless its family says
/// otherwise.
struct HostileDocument {
    const char* name;
    std::function<std::string()> make;
};

/// Documents of one kind.
struct HostileFamily {
    const char* name;
    std::vector<HostileDocument> documents;
};

/// All of them; the family "Sizes" has larger ones.
const std::vector<HostileFamily>& hostileFamilies();
