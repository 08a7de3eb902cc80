#include "FeedParser/DateContext.h"

#include "FeedParser/Text/ParserUtils.h"
#include "Foundation/Logger.h"

namespace Orvane::FeedParser {

void DateContext::end() {
    if (!raw) return;
    ParserUtils::parseDate(raw->c_str(), date, timeZone);
    if (!date.get()) {
        gLogParserDates.log("FeedParser: Couldn't parse date '%s' in <%@>", *raw, info->url.get());
    }
}

}  // namespace Orvane::FeedParser
