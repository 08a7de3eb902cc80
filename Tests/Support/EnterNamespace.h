#pragma once

namespace Support {

/// How a process came into a namespace of its own.
enum class EnteredNamespace {
    kNot,            ///< the system does not allow it; `errno` says why
    kDirectly,       ///< where it is, so that it can go back
    kInsideNewUser,  ///< as root of a new user namespace, out of which there is no way
};

/// Puts the process into a new namespace of a kind (one of `CLONE_NEW...`), inside a new user
/// namespace if its user may not make one otherwise. REQUIRES for that: a single thread.
[[nodiscard]] EnteredNamespace enterNamespace(int kind);

}  // namespace Support
