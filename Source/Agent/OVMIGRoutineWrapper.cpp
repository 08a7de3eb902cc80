#include "Agent/OVMIGRoutineWrapper.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "SQLite/Database.h"

namespace Orvane {

using Foundation::NetError;
using Foundation::NetException;

namespace {

constexpr const char* kWhere =
    "kern_return_t OVMIGRoutineWrapper(mig_routine_t, mach_msg_header_t *, mach_msg_header_t *)";

}  // namespace

std::int32_t OVMIGRoutineWrapper(const std::function<void()>& routine) {
    const Foundation::AutoreleasePool pool;
    NetError result(NetError::kOrvane, OVIPCError);
    try {
        routine();
        if (SQLite::gDatabase) SQLite::gDatabase->saveRows();
        gLogIPC.log("...successful exit from OVMIGRoutineWrapper");
        result = NetError::None;
    } catch (const NetException& exception) {
        Foundation::doWarnAboutException(&exception, kWhere);
        result = exception.getError();
    } catch (...) {
        Foundation::warnAboutCurrentException(kWhere);
    }
    return result.wrapAsMachError();
}

}  // namespace Orvane
