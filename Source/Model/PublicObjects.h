#pragma once

class OVObject;

namespace Orvane {

class AuthorCore;
class ClientCore;
class ContentCore;
class EnclosureCore;
class EntryCore;
class SubscriptionCore;

/// Who makes the public objects of rows, which applications see. Set once per process; null until
/// then, and rows have no public objects.
class PublicObjects {
 public:
    virtual ~PublicObjects() = default;

    // Each makes the object of a row, which holds a reference to the row and gives itself to it by
    // `Core::setOVObject`, and later takes itself back. The current pool keeps the result alive, or
    // whoever retains it. Null if it cannot be made.

    virtual OVObject* make(ClientCore* row) = 0;
    virtual OVObject* make(SubscriptionCore* row) = 0;
    virtual OVObject* make(EntryCore* row) = 0;
    virtual OVObject* make(ContentCore* row) = 0;
    virtual OVObject* make(AuthorCore* row) = 0;
    virtual OVObject* make(EnclosureCore* row) = 0;
    /// The name of the object's class, for logs. Valid until the next call.
    virtual const char* getClassName(const OVObject* object) noexcept = 0;

    static PublicObjects* current();
    /// The port must outlive its use.
    static void setCurrent(PublicObjects* port);

    /// What the current port makes of a row; null if there is no port.
    template <class T>
    static OVObject* makeFor(T* row) {
        PublicObjects* port = current();
        return port ? port->make(row) : nullptr;
    }
};

}  // namespace Orvane
