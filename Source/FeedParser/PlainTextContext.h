#pragma once

#include "FeedParser/TextContext.h"

namespace Orvane::FeedParser {

/// A text that is wanted without markup.
class PlainTextContext : public TextContext {
 public:
    using TextContext::TextContext;

    /// Never null: an element without content has the empty text.
    Foundation::String* getText() const override;

 private:
    Foundation::StringReturner makeText() const;
};

}  // namespace Orvane::FeedParser
