#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "Model/Core.h"

#include <cstdint>
#include <memory>
#include <string>

class OVObject;

/// What a public object holds of the row that it stands for.
///
/// All of a process know each other. When the agent has made a new database, the rows that they
/// hold are not of it: the objects then find their rows again by what tells them in all databases,
/// or are lost.
class OVInternal : Foundation::Uncopyable {
 public:
    OVInternal();
    /// The row has no public object any more.
    virtual ~OVInternal();

    /// Lets go of the row that there was. Either may be null. Throws `AssertionFailure` if another
    /// object stands for the new one; nothing has changed then.
    void setCore(Orvane::Core* core, OVObject* owner);

    OVObject* getOwner() const { return mOwner; }
    /// Whether what it stands for is not in the database that there is now.
    bool isLost() const { return mIsLost; }

    /// Comes before every use: sees to it that objects stand for rows of the database that is open
    /// now and, where nobody turns the run loop, that rows are not out of date.
    static void catchUp();
    /// The first half of that, for the middle of an operation: nothing that was read becomes out of
    /// date.
    static void catchUpWithConnection();

 protected:
    /// The order in which objects find their rows again.
    enum class Rank : std::uint8_t { Client, Feed, Entry, Part };
    virtual Rank getRank() const { return Rank::Part; }
    /// The row of the present database that is the same thing; null if there is none.
    virtual Foundation::Ref<Orvane::Core> findAgain() { return nullptr; }
    /// Called behind that, with or without success.
    virtual void foundAgain() {}

    void setOwner(OVObject* owner) { mOwner = owner; }
    Orvane::Core* getCore() const { return mCore.get(); }
    /// The same for use. Throws `NetException` if it is lost, `AssertionFailure` if there is none.
    Orvane::Core& useCore() const;

 private:
    static void reattachAll();
    bool isOutdated() const;
    void reattach();

    Foundation::Ref<Orvane::Core> mCore;
    OVObject* mOwner = nullptr;
    bool mIsLost = false;
    OVInternal* mNext;
    OVInternal* mPrevious = nullptr;
};

/// For logs.
std::string describeForFormat(const OVInternal* internal);
