#pragma once

namespace Foundation {
struct Logger;
extern Logger gLog, gWarn, gLogMsg, gLogPrefs;
}  // namespace Foundation

namespace SQLite {
extern Foundation::Logger gLogSQL, gLogPersist, gLogTruth;
}  // namespace SQLite

namespace Orvane {
extern Foundation::Logger gLogParser, gLogParserVerbose, gLogParserDates, gLogDownload, gLogSub,
    gLogFeed, gLogSocket, gLogSCGI, gLogSCGIVerbose, gLogAPI, gLogAPIVerbose, gLogAgent,
    gLogAgentVerbose, gLogRender, gLogRenderOut, gLogHTTP, gLogQueue, gLogIPC;
namespace Lua {
extern Foundation::Logger gLogLua;
}  // namespace Lua
}  // namespace Orvane

extern Foundation::Logger gLogTidier, gLogTidierVerbose, gLogSync, gLogSyncVerbose;
