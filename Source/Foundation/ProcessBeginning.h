#pragma once

#include "Foundation/Uncopyable.h"

#include <spawn.h>

namespace Foundation {

/// What a program that we start begins with: no terminal, no signal held back or ignored, and no
/// descriptor of ours but the one that it is given as `kGiven`. Its standard streams lead nowhere.
struct ProcessBeginning : Uncopyable {
    static constexpr int kGiven = 3;

    /// `given` is one of this process's descriptors, and stays its own.
    explicit ProcessBeginning(int given);
    ~ProcessBeginning();

    posix_spawn_file_actions_t actions;
    posix_spawnattr_t attributes;
};

}  // namespace Foundation
