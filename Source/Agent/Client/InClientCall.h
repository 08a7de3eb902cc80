#pragma once

#include "Foundation/Logger.h"
#include "Foundation/Uncopyable.h"

namespace Orvane {

/// Stands on the stack around a call to the agent: logs it with the time that it took, warns of one
/// that is made within a transaction, and puts the time-out of calls back to the usual at its end.
class InClientCall : Foundation::Uncopyable {
 public:
    static constexpr int kTimeoutMS = 30000;

    template <class... Args>
    explicit InClientCall(OVFormatString<Args...> format, const Args&... arguments) {
        gLogIPC.log(format, arguments...);
        begin();
    }
    ~InClientCall();

 private:
    void begin();

    double mStartTime = 0;
    bool mIsLogged = false;
    int mExceptions = 0;  ///< in flight at the beginning
};

}  // namespace Orvane
