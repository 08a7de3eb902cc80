#pragma once

#include <cstddef>
#include <string>

namespace Commands {

/// A bar on standard error, if that is a terminal.
class Progress {
 public:
    Progress();
    /// Takes the bar away.
    ~Progress();
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void show(std::size_t done, std::size_t all) const;

    /// The bar as a text: "[=====>    ] 5/10".
    static std::string bar(std::size_t done, std::size_t all, std::size_t columns);

 private:
    bool mIsShown;
};

}  // namespace Commands
