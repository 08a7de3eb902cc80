#include "Foundation/DateParser.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdlib>
#include <fstream>
#include <string>

using namespace Foundation;
using nlohmann::json;

namespace {

/// The time as the corpus writes it: "2005-10-21T00:12:34Z".
std::string utcOf(const Date* date) {
    if (!date) return "null";
    std::string text = Ref<String>(date->toString())->utf8();
    text[text.find(' ')] = 'T';
    return text.substr(0, text.find(' ')) + 'Z';
}

/// The parts of a date as the corpus lists them, null for what the text does not give.
json fieldsOf(const std::string& text) {
    GregorianDate d;
    std::uint32_t mask = 0;
    char zone[256];
    std::int32_t offset = 0;
    if (!parsedatelite(text.c_str(), d, mask, zone, sizeof zone, offset)) return nullptr;
    const int parts[] = {d.year, d.month, d.day, d.hour, d.minute, static_cast<int>(d.second)};
    json fields = json::array();
    std::uint32_t bit = 1;
    for (const int part : parts) {
        fields.push_back(mask & bit ? json(part) : json(nullptr));
        bit *= 2;
    }
    return fields;
}

/// Why an entry's text was not read as it should; empty if it was.
std::string faultOf(const json& entry) {
    const std::string text = entry["text"];
    Ref<Date> date;
    Ref<TimeZone> zone;
    const bool isDate = parseDateText(text.c_str(), date, zone);
    if (isDate != entry["ok"].get<bool>()) return isDate ? "is read" : "is not read";
    if (!isDate) return "";
    const json fields = fieldsOf(text);
    if (fields != entry["fields"]) return "has the fields " + fields.dump();
    const std::string utc = utcOf(date);
    if (entry["utc"] != "PARTIAL" && utc != entry["utc"]) return "is " + utc;
    const std::string how = entry["zone"];
    const bool isGMT = zone && zone->getName() == "GMT";
    if ((how == "gmt" || how == "implied0") && !isGMT) return "is not in GMT";
    return "";
}

/// The corpus's dates; null where there is no corpus.
json readDates() {
    const char* directory = std::getenv("ORVANE_CORPUS");
    if (!directory) return nullptr;
    std::ifstream file(std::string(directory) + "/dates.json");
    return json::parse(file);
}

}  // namespace

TEST(DateCorpus, IsReadAsItsPublishersMeantIt) {
    const json dates = readDates();
    if (dates.is_null()) GTEST_SKIP() << "ORVANE_CORPUS is not set";
    ASSERT_FALSE(dates.empty());
    const AutoreleasePool pool;
    int soft = 0;
    int softRight = 0;
    for (const json& entry : dates) {
        const std::string fault = faultOf(entry);
        const std::string message = entry["text"].get<std::string>() + ": " + fault;
        if (entry["level"] == "gate") {
            EXPECT_EQ(fault, "") << message;
        } else {
            ++soft;
            softRight += fault.empty();
            if (!fault.empty()) std::printf("soft: %s\n", message.c_str());
        }
    }
    std::printf("dates: %zu, of which soft: %d, of which right: %d\n", dates.size(), soft,
                softRight);
    EXPECT_GE(softRight * 100, soft * 95);
}
