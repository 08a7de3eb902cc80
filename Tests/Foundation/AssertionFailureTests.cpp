#include "Foundation/AssertionFailure.h"

#include "Foundation/Logger.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;
using Lines = std::vector<std::string>;

namespace {

/// What `fails` throws.
template <class Function>
std::string thrownBy(Function&& fails) {
    try {
        fails();
    } catch (const AssertionFailure& e) {
        return e.what();
    }
    return "nothing was thrown";
}

void failWithoutMessage(int x) {
    OV_ASSERT(x > 0);
}

}  // namespace

TEST(AssertionFailure, IsLoggedWithFunctionAndMessageAndThrown) {
    const LogCapture log;
    EXPECT_EQ(thrownBy([] {
                  AssertionFailure::failed("void f(int)", "x > 0", "x is %d, not %s", -1, "more");
              }),
              "x is -1, not more");
    EXPECT_EQ(log.lines(),
              Lines({"[WARNING] ASSERTION FAILED: in void f(int): x is -1, not more"}));
}

TEST(AssertionFailure, HasTheConditionForAnEmptyMessage) {
    const LogCapture log;
    EXPECT_EQ(thrownBy([] { AssertionFailure::failed("void f(int)", "x > 0"); }), "x > 0");
    EXPECT_EQ(thrownBy([] { AssertionFailure::failed("void f(int)", "100%s", ""); }), "100%s");
    EXPECT_EQ(log.lines(), Lines({"[WARNING] ASSERTION FAILED: in void f(int): x > 0",
                                  "[WARNING] ASSERTION FAILED: in void f(int): 100%s"}));
}

TEST(AssertionFailure, NamesTheFullSignatureOfTheFunctionThatAsserts) {
    const LogCapture log;
    EXPECT_EQ(thrownBy([] { failWithoutMessage(-1); }), "x > 0");
    EXPECT_TRUE(log.contains("failWithoutMessage(int): x > 0"));
    EXPECT_NO_THROW(failWithoutMessage(1));
}

TEST(AssertionFailure, IsAnException) {
    const LogCapture log;
    EXPECT_THROW(failWithoutMessage(-1), std::runtime_error);
}

TEST(AssertionFailure, IsThrownEvenIfWarningsAreOff) {
    const LogCapture log;
    gWarn.setEnabled(false);
    EXPECT_EQ(thrownBy([] { failWithoutMessage(-1); }), "x > 0");
    gWarn.setEnabled(true);
    EXPECT_EQ(log.lines(), Lines());
}

TEST(AssertionFailure, CountsAsALogCallWhileItIsLogged) {
    class DepthSink : public LogSink {
     public:
        void write(const Logger&, std::string_view) override { depth = insideLogCall(); }
        int depth = 0;
    } sink;
    LogSink* const previous = setLogSink(&sink);
    EXPECT_EQ(thrownBy([] { failWithoutMessage(-1); }), "x > 0");
    setLogSink(previous);
    EXPECT_EQ(sink.depth, 2);
    EXPECT_EQ(insideLogCall(), 0);
}
