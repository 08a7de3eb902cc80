#include "Foundation/TimeZone.h"
#include "Model/EntryTest.h"
#include "Support/DefaultZone.h"
#include "Utilities/XMLElement.h"

#include <libxml/parser.h>
#include <libxml/xmlmemory.h>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LogCapture;

namespace {

constexpr const char* kEntry =
    "<entry xmlns='http://www.w3.org/2005/Atom' xmlns:x='http://x.org/'>"
    "<title>Old</title><id>old</id><author><name>Old</name></author>"
    "<link rel='alternate' href='http://old.org/'/><link rel='enclosure' href='http://old.org/e'/>"
    "<link rel='via' href='http://via.org/'/><published>2005-01-01T00:00:00Z</published>"
    "<updated>2005-01-01T00:00:00Z</updated><content>Old</content><summary>Old</summary>"
    "<x:more>kept</x:more><x:title>kept too</x:title></entry>";

/// libxml2 has no memory for a parser while this lives.
class NoParsers {
 public:
    NoParsers() {
        xmlMemGet(&sFree, &sAllocate, &sReallocate, &sCopy);
        xmlMemSetup(sFree, allocate, sReallocate, sCopy);
        xmlSetStructuredErrorFunc(nullptr, [](void*, xmlError*) {});
    }
    ~NoParsers() {
        xmlMemSetup(sFree, sAllocate, sReallocate, sCopy);
        xmlSetStructuredErrorFunc(nullptr, nullptr);
    }
    NoParsers(const NoParsers&) = delete;
    NoParsers& operator=(const NoParsers&) = delete;

 private:
    static void* allocate(std::size_t size) {
        return size == sizeof(xmlParserCtxt) ? nullptr : sAllocate(size);
    }

    static inline xmlFreeFunc sFree;
    static inline xmlMallocFunc sAllocate;
    static inline xmlReallocFunc sReallocate;
    static inline xmlStrdupFunc sCopy;
};

class EntryXMLTest : public EntryTest {
 protected:
    Ref<EntryCore> entryWith(const char* source) {
        Ref<EntryCore> entry = newEntry("abc");
        if (source) entry->setContentColumn("XMLRepresentation", nullptr, bytes(source));
        return entry;
    }
    /// The source with the columns of the entry put in, without the line ends between elements.
    std::string updated(const EntryCore& entry) {
        const Ref<XMLElement> element = entry._parseXMLRepresentation();
        type = entry._updateAtomXML(*element, false);
        return flat(element);
    }
    static std::string flat(const Ref<XMLElement>& element) {
        if (!element.get()) return "(null)";
        const std::string text = textOf(element->ov_asData());
        std::string result;
        for (std::size_t i = 0; i < text.size(); ++i) {
            if (text[i] == '\n') {
                i = std::min(text.find_first_not_of(' ', i + 1), text.size()) - 1;
            } else {
                result += text[i];
            }
        }
        return result;
    }

    std::string type;
    const Support::DefaultZone zone{"GMT"};
    static constexpr const char* kEmpty = "<entry xmlns='http://www.w3.org/2005/Atom'/>";
    const std::string start = "<entry xmlns=\"http://www.w3.org/2005/Atom\">";
};

}  // namespace

TEST_F(EntryXMLTest, GivesTheSourceAsAnElement) {
    const Ref<XMLElement> element = entryWith(kEntry)->getXMLElement(false);
    ASSERT_NE(element.get(), nullptr);
    EXPECT_TRUE(element->ov_hasName("entry", "http://www.w3.org/2005/Atom"));
    EXPECT_EQ(element->getElements("title", "http://www.w3.org/2005/Atom")->count(), 1u);
}

TEST_F(EntryXMLTest, HasNoElementWithoutASource) {
    const Ref<XMLElement> element = entryWith(nullptr)->getXMLElement(true);
    EXPECT_EQ(element.get(), nullptr);
}

TEST_F(EntryXMLTest, HasNoElementWhereTheSourceIsNoXML) {
    const LogCapture log;
    const Ref<XMLElement> element = entryWith("")->getXMLElement(false);
    EXPECT_EQ(element.get(), nullptr);
}

TEST_F(EntryXMLTest, StrippedHasOnlyWhatIsNotInTheColumns) {
    EXPECT_EQ(flat(entryWith(kEntry)->getXMLElement(true)),
              "<entry xmlns=\"http://www.w3.org/2005/Atom\" xmlns:x=\"http://x.org/\">"
              "<link rel=\"via\" href=\"http://via.org/\"/>"
              "<x:more>kept</x:more><x:title>kept too</x:title></entry>");
}

TEST_F(EntryXMLTest, PutsInWhatTheColumnsHave) {
    const Ref<EntryCore> entry = entryWith(kEmpty);
    entry->mTitle.setValue(str("A < B"));
    entry->mAlternateURL.setValue(url("http://e.org/p"));
    entry->mDatePublished.setValue(date(151546354));
    entry->mDateUpdated.setValue(date(151546355));
    entry->setContentColumn("content", str("text/html"), bytes("<p>c</p>"));
    entry->setContentColumn("summary", str("text/plain"), bytes("s"));
    AuthorCore* ann = author("Ann");
    ann->mEmail.setValue(str("a@e.org"));
    ann->mURL.setValue(url("http://a.org/"));
    entry->setAuthor(ann);
    entry->addToEnclosures(enclosure("http://e.org/1", "audio/mpeg", 12));
    entry->addToEnclosures(enclosure("http://e.org/2"));
    entry->addToEnclosures(make<EnclosureCore>());
    EXPECT_EQ(updated(*entry),
              start +
                  "<title>A &lt; B</title>"
                  "<link rel=\"alternate\" type=\"text/html\" href=\"http://e.org/p\"/>"
                  "<id>abc</id><published>2005-10-21T00:12:34.000+00:00</published>"
                  "<updated>2005-10-21T00:12:35.000+00:00</updated>"
                  "<content type=\"html\">&lt;p&gt;c&lt;/p&gt;</content>"
                  "<summary type=\"text\">s</summary>"
                  "<author><name>Ann</name><email>a@e.org</email>"
                  "<uri>http://a.org/</uri></author>"
                  "<link rel=\"enclosure\" type=\"audio/mpeg\" href=\"http://e.org/1\" "
                  "length=\"12\"/>"
                  "<link rel=\"enclosure\" href=\"http://e.org/2\"/></entry>");
    EXPECT_EQ(type, "application/atom+xml");
}

TEST_F(EntryXMLTest, AnEntryWithoutATitleGetsAnEmptyOne) {
    EXPECT_EQ(updated(*entryWith(kEmpty)), start + "<title/><id>abc</id></entry>");
}

TEST_F(EntryXMLTest, ReplacesWhatWasThere) {
    const std::string text = updated(*entryWith(kEntry));
    EXPECT_EQ(text.find("old"), std::string::npos);
    EXPECT_EQ(text.find("Old"), std::string::npos);
    EXPECT_EQ(text.find("2005"), text.find("2005/Atom"));
    EXPECT_NE(text.find("<x:title>kept too</x:title>"), std::string::npos);
    EXPECT_NE(text.find("http://via.org/"), std::string::npos);
}

TEST_F(EntryXMLTest, WritesXHTMLAsElements) {
    const Ref<EntryCore> entry = entryWith(kEmpty);
    entry->setContentColumn("content", str("application/xhtml+xml"), bytes("<p>a</p><p>b</p>"));
    EXPECT_EQ(updated(*entry), start +
                                   "<title/><id>abc</id><content type=\"xhtml\">"
                                   "<div xmlns=\"http://www.w3.org/1999/xhtml\">"
                                   "<p>a</p><p>b</p></div></content></entry>");
}

TEST_F(EntryXMLTest, WritesXHTMLThatCannotBeReadAsHTML) {
    const Ref<EntryCore> entry = entryWith(kEmpty);
    entry->setContentColumn("content", str("application/xhtml+xml"), bytes("<p>a</p>"));
    entry->setContentColumn("summary", str("application/xhtml+xml"), bytes(""));
    const Ref<XMLElement> element = entry->_parseXMLRepresentation();
    LogCapture log;
    {
        const NoParsers noParsers;
        entry->_updateAtomXML(*element, false);
    }
    EXPECT_EQ(flat(element), start +
                                 "<title/><id>abc</id>"
                                 "<content type=\"html\">&lt;p&gt;a&lt;/p&gt;</content></entry>");
    EXPECT_EQ(log.count("Exception parsing XML: std::bad_alloc"), 2);
}

TEST_F(EntryXMLTest, LeavesOutXHTMLWithNothingInIt) {
    const Ref<EntryCore> entry = entryWith(kEmpty);
    entry->setContentColumn("content", str("application/xhtml+xml"), bytes(""));
    entry->setContentColumn("summary", str("text/plain"), bytes(""));
    EXPECT_EQ(updated(*entry), start + "<title/><id>abc</id></entry>");
}

TEST_F(EntryXMLTest, WritesOtherDataInItsType) {
    const Ref<EntryCore> entry = entryWith(kEmpty);
    entry->setContentColumn("content", str("image/png"), bytes("abc"));
    EXPECT_EQ(updated(*entry), start +
                                   "<title/><id>abc</id>"
                                   "<content type=\"image/png\">YWJj</content></entry>");
}

TEST_F(EntryXMLTest, AddsElementsOfAtomWhateverTheDefaultNamespaceIs) {
    const Ref<EntryCore> entry =
        entryWith("<a:entry xmlns:a='http://www.w3.org/2005/Atom' xmlns='http://other.org/'/>");
    const Ref<XMLElement> element = entry->_parseXMLRepresentation();
    entry->_updateAtomXML(*element, false);
    EXPECT_EQ(element->getElements("title", "http://www.w3.org/2005/Atom")->count(), 1u);
    EXPECT_EQ(element->getElements("id", "http://www.w3.org/2005/Atom")->count(), 1u);
    entry->_updateAtomXML(*element, false);
    EXPECT_EQ(element->getChildCount(), 2u);
}
