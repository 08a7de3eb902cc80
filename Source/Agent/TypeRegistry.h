#pragma once

namespace Orvane {

/// Where the desktop keeps which program opens which documents.
class TypeRegistry {
 public:
    virtual ~TypeRegistry() = default;

    /// Makes the running program known. Whether it is now.
    virtual bool registerApplication() = 0;

    /// That of the process.
    static TypeRegistry& current();
    /// The object must outlive its use; null for the desktop's own.
    static void setCurrent(TypeRegistry* registry);
};

}  // namespace Orvane
