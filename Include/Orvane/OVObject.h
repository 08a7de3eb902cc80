#pragma once

#include <Orvane/OVBase.h>

#include <cstddef>
#include <memory>
#include <string>

/// Base of the objects that stand for what the database holds: clients, feeds, entries and what
/// belongs to them.
///
/// Objects are shared: hold them by `std::shared_ptr`, which all operations give. While an object
/// lives, all operations that find the same thing give the same object.
///
/// An object reads its values from the database when it is asked, and is told when others change
/// them. If what it stands for has been deleted, or is not in the database that the agent had to
/// make anew, getters give what was read before, or throw `OVException`.
///
/// All objects belong to one thread: the one that turns the run loop, which is GLib's default main
/// context, and that used the library first. An application that turns no loop gets right answers
/// as well, and is told of nothing.
class OV_EXPORT OVObject : public std::enable_shared_from_this<OVObject> {
 public:
    OVObject(const OVObject&) = delete;
    OVObject& operator=(const OVObject&) = delete;
    virtual ~OVObject();

    /// Whether the two are of one class and stand for the same thing. `other` may be null.
    virtual bool isEqual(const OVObject* other) const;
    /// Equal objects have equal hashes.
    virtual std::size_t hash() const;
    /// A text for logs.
    virtual std::string description() const;

 protected:
    OVObject();
};

/// Makes objects arguments of `%@`, see `OVFormat.h`.
OV_EXPORT std::string describeForFormat(const OVObject* object);
