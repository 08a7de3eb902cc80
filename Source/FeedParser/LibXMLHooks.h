#pragma once

#include "Foundation/Uncopyable.h"

struct _xmlParserCtxt;
struct _xmlParserInput;

namespace Orvane::FeedParser {

class Parser;

/// While it lives, libxml2 opens nothing for anybody in this process, and tells the parser what it
/// has to say outside of any document.
class LibXMLHooks : Foundation::Uncopyable {
 public:
    explicit LibXMLHooks(Parser& parser);
    ~LibXMLHooks();

    /// The document is read: nothing more is told to the parser.
    void endReading();

 private:
    using Loader = _xmlParserInput* (*)(const char*, const char*, _xmlParserCtxt*);

    Loader mSavedLoader;
};

}  // namespace Orvane::FeedParser
