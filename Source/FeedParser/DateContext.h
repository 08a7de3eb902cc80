#pragma once

#include "FeedParser/TextContext.h"
#include "Foundation/Date.h"
#include "Foundation/TimeZone.h"

namespace Orvane::FeedParser {

/// A date with its time zone. Both are null for a text that is none.
class DateContext : public TextContext {
 public:
    using TextContext::TextContext;

    void end() override;

    Foundation::Ref<Foundation::Date> date;
    Foundation::Ref<Foundation::TimeZone> timeZone;
};

}  // namespace Orvane::FeedParser
