#include <Orvane/OVListAdditions.h>

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

namespace {

struct Word {
    explicit Word(std::string word) : text(std::move(word)) {}
    std::string text;
    std::size_t size() const { return text.size(); }
    std::shared_ptr<Word> twice() const { return std::make_shared<Word>(text + text); }
    bool operator==(const Word&) const = default;
};

using Words = std::vector<std::shared_ptr<Word>>;

Words words(std::initializer_list<const char*> texts) {
    Words list;
    for (const char* text : texts) {
        list.push_back(std::make_shared<Word>(text));
    }
    return list;
}

std::string joined(const Words& list) {
    std::string all;
    for (const std::shared_ptr<Word>& word : list) {
        all += word->text + ".";
    }
    return all;
}

}  // namespace

TEST(OVListAdditions, FindTheVeryObjectOnly) {
    Words list = words({"a", "b"});
    EXPECT_TRUE(ov_containsObjectIdenticalTo(list, list[1].get()));
    const Word equal("b");
    EXPECT_EQ(equal, *list[1]);
    EXPECT_FALSE(ov_containsObjectIdenticalTo<Word>(list, &equal));
    const Word* none = nullptr;
    EXPECT_FALSE(ov_containsObjectIdenticalTo<Word>(list, none));
    list.push_back(nullptr);
    EXPECT_TRUE(ov_containsObjectIdenticalTo<Word>(list, none));
    EXPECT_FALSE(ov_containsObjectIdenticalTo<Word>({}, none));
}

TEST(OVListAdditions, ListTheResultsOfACall) {
    const Words list = words({"a", "bcd"});
    EXPECT_EQ(ov_arrayByApplyingSelector(list, &Word::size), (std::vector<std::size_t>{1, 3}));
    EXPECT_EQ(joined(ov_arrayByApplyingSelector(list, &Word::twice)), "aa.bcdbcd.");
    const auto append = [](const std::shared_ptr<Word>& word, const std::string& tail) {
        return word->text + tail;
    };
    EXPECT_EQ(ov_arrayByApplyingSelector(list, append, std::string("!")),
              (std::vector<std::string>{"a!", "bcd!"}));
    EXPECT_EQ(joined(list), "a.bcd.") << "the list stays";
    EXPECT_TRUE(ov_arrayByApplyingSelector(Words(), &Word::size).empty());
}

TEST(OVListAdditions, ReplaceElementsByTheResultsOfACall) {
    Words list = words({"a", "b"});
    ov_applySelector(list, &Word::twice);
    EXPECT_EQ(joined(list), "aa.bb.");
    const auto append = [](const std::shared_ptr<Word>& word, const std::string& tail) {
        return std::make_shared<Word>(word->text + tail);
    };
    ov_applySelector(list, append, std::string("!"));
    EXPECT_EQ(joined(list), "aa!.bb!.");
    Words empty;
    ov_applySelector(empty, &Word::twice);
    EXPECT_TRUE(empty.empty());
}

TEST(OVListAdditions, LetThroughWhatTheCallThrows) {
    Words list = words({"a", "b", "c"});
    const auto failing = [](const std::shared_ptr<Word>& word) {
        if (word->text == "b") throw std::runtime_error("b");
        return word->twice();
    };
    EXPECT_THROW(ov_applySelector(list, failing), std::runtime_error);
    EXPECT_EQ(joined(list), "aa.b.c.");
    EXPECT_THROW(ov_arrayByApplyingSelector(list, failing), std::runtime_error);
}
