#include "ListingJSON.h"

#include "DateText.h"
#include "JSONText.h"

#include <nlohmann/json.hpp>

#include <utility>

namespace Commands {

namespace {

using JSON = nlohmann::ordered_json;

JSON jsonOf(const Value& value) {
    struct Visitor {
        JSON operator()(std::monostate) const { return nullptr; }
        JSON operator()(const OVDate& date) const { return DateText::iso8601(date); }
        JSON operator()(const std::vector<std::string>& list) const {
            JSON all = JSON::array();
            for (const std::string& each : list) {
                all.push_back(each);
            }
            return all;
        }
        JSON operator()(bool flag) const { return flag; }
        JSON operator()(long long number) const { return number; }
        JSON operator()(double number) const { return number; }
        JSON operator()(const std::string& text) const { return text; }
    };
    return std::visit(Visitor(), value);
}

void add(const Listing& listing, const Listing::Row& row, JSON& object) {
    for (std::size_t i = 0; i < listing.columns.size(); ++i) {
        object[listing.columns[i].key] = jsonOf(row.values[i]);
    }
}

JSON head() {
    return {{"schema", ListingJSON::kSchema}};
}

std::string dump(const JSON& json, int indent) {
    std::string text = json.dump(indent, ' ', false, JSON::error_handler_t::replace) + '\n';
    JSONText::escapeLineEnds(text);
    return text;
}

constexpr int kIndent = 2;

}  // namespace

std::string ListingJSON::document(const Listing& listing) {
    JSON all = JSON::array();
    for (const Listing::Row& row : listing.rows) {
        JSON object = JSON::object();
        add(listing, row, object);
        all.push_back(std::move(object));
    }
    JSON json = head();
    json[listing.name] = std::move(all);
    return dump(json, kIndent);
}

std::string ListingJSON::object(const Listing& listing) {
    JSON json = head();
    add(listing, listing.rows.at(0), json);
    return dump(json, kIndent);
}

std::string ListingJSON::lines(const Listing& listing) {
    std::string all;
    for (const Listing::Row& row : listing.rows) {
        JSON json = head();
        add(listing, row, json);
        all += dump(json, -1);
    }
    return all;
}

}  // namespace Commands
