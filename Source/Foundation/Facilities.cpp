#include "Foundation/Facilities.h"

#include "Foundation/Logger.h"

// Every facility of the log, with its name and default mode. 0 and 1 both obey the preferences:
// 1 records that the facility was meant to be on. The warning log's 7 is on whatever they say.

namespace Foundation {
constinit Logger gLog{nullptr, 1};
constinit Logger gWarn{"WARNING", 7};
constinit Logger gLogMsg{"Msg", 0};
constinit Logger gLogPrefs{"Prefs", 0};
}  // namespace Foundation

namespace SQLite {
constinit Foundation::Logger gLogSQL{"SQL", 0};
constinit Foundation::Logger gLogPersist{"Persist", 0};
constinit Foundation::Logger gLogTruth{"Truth", 1};
}  // namespace SQLite

namespace Orvane {
constinit Foundation::Logger gLogParser{"Parser", 0};
constinit Foundation::Logger gLogParserVerbose{"ParserVerbose", 0};
constinit Foundation::Logger gLogParserDates{"ParserDates", 1};
constinit Foundation::Logger gLogDownload{"Download", 1};
constinit Foundation::Logger gLogSub{"Sub", 0};
constinit Foundation::Logger gLogFeed{"Feed", 0};
constinit Foundation::Logger gLogSocket{"Socket", 0};
constinit Foundation::Logger gLogSCGI{"SCGI", 0};
constinit Foundation::Logger gLogSCGIVerbose{"SCGIVerbose", 0};
constinit Foundation::Logger gLogAPI{"API", 1};
constinit Foundation::Logger gLogAPIVerbose{"API.Verbose", 0};
constinit Foundation::Logger gLogAgent{"Agent", 1};
constinit Foundation::Logger gLogAgentVerbose{"Agent.Verbose", 0};
constinit Foundation::Logger gLogRender{"Render", 1};
constinit Foundation::Logger gLogRenderOut{"RenderOut", 0};
constinit Foundation::Logger gLogHTTP{"HTTP", 0};
constinit Foundation::Logger gLogQueue{"Queue", 0};
constinit Foundation::Logger gLogIPC{"IPC", 1};
namespace Lua {
constinit Foundation::Logger gLogLua{"Lua", 0};
}  // namespace Lua
}  // namespace Orvane

constinit Foundation::Logger gLogTidier{"Tidier", 0};
constinit Foundation::Logger gLogTidierVerbose{"TidierVerbose", 0};
constinit Foundation::Logger gLogSync{"Sync", 0};
constinit Foundation::Logger gLogSyncVerbose{"SyncVerbose", 0};
