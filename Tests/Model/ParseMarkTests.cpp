#include "Model/ParseMark.h"

#include "Model/FeedTest.h"
#include "Support/FileAccess.h"

#include <stdexcept>

using namespace Orvane;

namespace {

class ParseMarkTest : public FeedTest {
 protected:
    ParseMarkTest() { std::filesystem::create_directories(truth("")); }

    std::string marks() const {
        return exists(truth(".parsing")) ? directory.readFile("Orvane/Feeds/.parsing") : "";
    }

    Foundation::URL* const document = url("file:///feeds/a.xml");
};

}  // namespace

TEST_F(ParseMarkTest, IsInTheFileWhileItLives) {
    {
        const ParseMark mark(document);
        EXPECT_FALSE(mark.isBlocked());
        EXPECT_EQ(marks(), "1 788918400.000 /feeds/a.xml\n");
    }
    EXPECT_EQ(marks(), "");
}

TEST_F(ParseMarkTest, GoesWithAnExceptionToo) {
    try {
        const ParseMark mark(document);
        throw std::runtime_error("parser");
    } catch (const std::runtime_error&) {
    }
    EXPECT_EQ(marks(), "");
}

TEST_F(ParseMarkTest, BlocksForADayWhatWasLeftBehindTwice) {
    leaveMarks(document, 1);
    EXPECT_FALSE(ParseMark(document).isBlocked());
    EXPECT_EQ(marks(), "");
    leaveMarks(document, 2);
    EXPECT_TRUE(ParseMark(document).isBlocked());
    EXPECT_FALSE(ParseMark(url("file:///feeds/b.xml")).isBlocked());
    clock.advanceBy(ParseMark::kBlockedSeconds - 1);
    EXPECT_TRUE(ParseMark(document).isBlocked());
    EXPECT_EQ(marks(), "2 788918400.000 /feeds/a.xml\n");
    clock.advanceBy(1);
    EXPECT_FALSE(ParseMark(document).isBlocked());
    EXPECT_EQ(marks(), "");
}

TEST_F(ParseMarkTest, CountsOnBehindTheDay) {
    leaveMarks(document, 2);
    clock.advanceBy(ParseMark::kBlockedSeconds);
    const ParseMark mark(document);
    EXPECT_EQ(marks(), "3 789004800.000 /feeds/a.xml\n");
}

TEST_F(ParseMarkTest, DoesNotTrustADateFarInTheFuture) {
    leaveMarks(document, 2);
    clock.jumpTo(clock.now() - 2 * ParseMark::kBlockedSeconds);
    EXPECT_FALSE(ParseMark(document).isBlocked());
}

TEST_F(ParseMarkTest, KeepsTheMarksOfOthers) {
    leaveMarks(document, 1);
    {
        const ParseMark mark(url("file:///feeds/b%20c.xml"));
        EXPECT_EQ(marks(), "1 788918400.000 /feeds/a.xml\n1 788918400.000 /feeds/b c.xml\n");
    }
    EXPECT_EQ(marks(), "1 788918400.000 /feeds/a.xml\n");
}

TEST_F(ParseMarkTest, DoesNothingWithinAnotherOfItsDocument) {
    const ParseMark outer(document);
    {
        const ParseMark inner(document);
        EXPECT_FALSE(inner.isBlocked());
        EXPECT_EQ(marks(), "1 788918400.000 /feeds/a.xml\n");
    }
    EXPECT_EQ(marks(), "1 788918400.000 /feeds/a.xml\n");
}

TEST_F(ParseMarkTest, IsNotMadeForWhatIsNotStored) {
    const ParseMark none(nullptr);
    EXPECT_FALSE(none.isBlocked());
    const ParseMark remote(url("http://example.org/a.xml"));
    EXPECT_FALSE(remote.isBlocked());
    EXPECT_FALSE(exists(truth(".parsing")));
}

TEST_F(ParseMarkTest, ReadsNothingOutOfWhatIsNoMark) {
    directory.writeFile("Orvane/Feeds/.parsing", "nonsense\n2 x /feeds/a.xml\n\n2 1\n");
    EXPECT_FALSE(ParseMark(document).isBlocked());
    EXPECT_EQ(marks(), "");
}

TEST_F(ParseMarkTest, IsForgottenInTheEnd) {
    leaveMarks(document, 2);
    clock.advanceBy(31 * ParseMark::kBlockedSeconds);
    const ParseMark mark(document);
    EXPECT_EQ(marks().substr(0, 2), "1 ");
}

TEST_F(ParseMarkTest, LetsADocumentBeParsedWhereItCannotBeMade) {
    const Support::LoggingOn on({});
    std::filesystem::remove_all(truth(""));
    EXPECT_FALSE(ParseMark(document).isBlocked());
    EXPECT_EQ(log.count("Unable to mark a document as being parsed: 2"), 2);
}
