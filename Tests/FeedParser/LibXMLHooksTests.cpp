#include "FeedParser/LibXMLHooks.h"

#include "FeedParser/Parser.h"
#include "Foundation/Logger.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <libxml/globals.h>
#include <libxml/parser.h>
#include <libxml/xmlerror.h>

#include <string>

using namespace Orvane;
using FeedParser::LibXMLHooks;
using FeedParser::Parser;

namespace {

class LibXMLHooksTest : public testing::Test {
 protected:
    LibXMLHooksTest() {
        SQLite::Database::initialize();
        xmlResetLastError();
    }
    ~LibXMLHooksTest() noexcept override {}

    Support::LogCapture log;
    Support::LoggingOn on{{&gLogParser}};
};

TEST_F(LibXMLHooksTest, TellTheParserOfErrorsOutsideOfTheDocument) {
    Parser parser(nullptr, nullptr);
    log.clear();
    LibXMLHooks hooks(parser);
    EXPECT_EQ(xmlGenericErrorContext, &parser);
    xmlGenericError(xmlGenericErrorContext, "%s %d\n", "error", 7);
    // More than the buffer holds is cut.
    xmlGenericError(xmlGenericErrorContext, "%s", std::string(300, 'x').c_str());
    // Nobody to tell.
    xmlGenericError(nullptr, "%s", "nobody");
    EXPECT_EQ(log.lines(),
              (std::vector<std::string>{"[Parser] Error 0, Line -1: error 7",
                                        "[Parser] Error 0, Line -1: " + std::string(255, 'x')}));
    hooks.endReading();
    EXPECT_EQ(xmlGenericErrorContext, nullptr);
}

TEST_F(LibXMLHooksTest, OpenNothingWhileTheyLive) {
    Parser parser(nullptr, nullptr);
    const xmlExternalEntityLoader before = xmlGetExternalEntityLoader();
    {
        const LibXMLHooks hooks(parser);
        EXPECT_NE(xmlGetExternalEntityLoader(), before);
        EXPECT_EQ(xmlLoadExternalEntity("/proc/self/exe", nullptr, nullptr), nullptr);
    }
    EXPECT_EQ(xmlGetExternalEntityLoader(), before);
    EXPECT_EQ(xmlGenericErrorContext, nullptr);
}

}  // namespace
