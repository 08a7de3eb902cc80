#include "OPML.h"

#include <Orvane/OVXMLElement.h>

#include <glib.h>

#include <algorithm>
#include <chrono>
#include <ctime>
#include <sstream>

namespace Commands {

namespace {

using Outlines = std::vector<Outline>;

bool isNamed(const std::string& name, const char* wanted) {
    return g_ascii_strcasecmp(name.c_str(), wanted) == 0;
}

std::string trimmed(const std::string& text) {
    const std::size_t first = text.find_first_not_of(" \t\r\n");
    if (first == std::string::npos) return {};
    return text.substr(first, text.find_last_not_of(" \t\r\n") - first + 1);
}

/// An element's attributes; what is known of an outline goes to its place. Programs differ in the
/// case of names.
Outline outlineOf(const OVXMLElement& element) {
    Outline outline;
    std::string text;
    std::string title;
    for (const std::string& name : element.attributeNames()) {
        const std::string value = element.attribute(name).value_or("");
        if (isNamed(name, "xmlUrl")) {
            outline.url = trimmed(value);
        } else if (isNamed(name, "htmlUrl")) {
            outline.page = trimmed(value);
        } else if (isNamed(name, "text")) {
            text = trimmed(value);
        } else if (isNamed(name, "title")) {
            title = trimmed(value);
        } else if (name.find(':') == std::string::npos && !isNamed(name, "type")) {
            // Prefixes mean nothing outside of their document.
            outline.others.emplace_back(name, value);
        }
    }
    outline.title = title.empty() ? text : title;
    return outline;
}

void collect(const OVXMLElement& element, int depth, Outlines& all) {
    for (const OVXMLElement& child : element.children()) {
        if (!isNamed(child.localName(), "outline")) {
            // The head has none; where outlines stand outside of the body, they are taken all the
            // same.
            collect(child, depth, all);
            continue;
        }
        Outline outline = outlineOf(child);
        const bool isFlat = outline.isFeed() || outline.title.empty() || depth >= OPML::kDepth;
        Outlines below;
        collect(child, depth + 1, below);
        const bool isFolder = !isFlat && !below.empty();
        if (isFolder) outline.children.swap(below);
        if (isFolder || outline.isFeed()) all.push_back(std::move(outline));
        std::move(below.begin(), below.end(), std::back_inserter(all));
    }
}

std::optional<Outlines> readLines(std::string_view document) {
    Outlines all;
    std::istringstream lines{std::string(document)};
    for (std::string line; std::getline(lines, line);) {
        line = trimmed(line);
        if (line.empty() || line[0] == '#') continue;
        Outline outline;
        outline.url = line.substr(0, line.find_first_of(" \t"));
        all.push_back(std::move(outline));
    }
    if (all.empty()) return std::nullopt;
    return all;
}

std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : text) {
        switch (c) {
            case '&':
                result += "&amp;";
                break;
            case '<':
                result += "&lt;";
                break;
            case '>':
                result += "&gt;";
                break;
            case '"':
                result += "&quot;";
                break;
            case '\n':
                result += "&#10;";
                break;
            case '\t':
                result += "&#9;";
                break;
            default:
                // XML can't hold the other control characters.
                if (static_cast<unsigned char>(c) >= 0x20) result += c;
        }
    }
    return result;
}

std::string attribute(const std::string& name, const std::string& value) {
    return ' ' + name + "=\"" + escaped(value) + '"';
}

void write(const Outlines& outlines, int depth, std::string& text) {
    for (const Outline& each : outlines) {
        const std::string indent(static_cast<std::size_t>(depth) * 2, ' ');
        text += indent + "<outline" + attribute("text", each.title);
        if (each.isFeed()) {
            text += attribute("title", each.title) + attribute("type", "rss") +
                    attribute("xmlUrl", each.url);
            if (!each.page.empty()) text += attribute("htmlUrl", each.page);
        }
        for (const auto& [name, value] : each.others) {
            text += attribute(name, value);
        }
        if (each.isFeed()) {
            text += "/>\n";
            continue;
        }
        text += ">\n";
        write(each.children, depth + 1, text);
        text += indent + "</outline>\n";
    }
}

/// As the format wants dates (RFC 822, with years of four digits).
std::string rfc822(const OVDate& date) {
    const std::time_t time = std::chrono::system_clock::to_time_t(date.timePoint());
    std::tm utc{};
    gmtime_r(&time, &utc);
    // Not strftime's names, which are of the user's language.
    constexpr const char* kDays[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
    constexpr const char* kMonths[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                       "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
    char clock[32];
    std::strftime(clock, sizeof clock, " %Y %H:%M:%S GMT", &utc);
    char day[8];
    std::strftime(day, sizeof day, ", %d ", &utc);
    return std::string(kDays[utc.tm_wday]) + day + kMonths[utc.tm_mon] + clock;
}

}  // namespace

std::optional<Outlines> OPML::read(std::string_view document) {
    if (document.find('<') == std::string_view::npos) return readLines(document);
    const std::optional<OVXMLElement> root = OVXMLElement::parse(document);
    if (!root) return std::nullopt;
    Outlines all;
    collect(*root, 0, all);
    if (all.empty()) return std::nullopt;
    return all;
}

std::string OPML::write(const Outlines& outlines, const std::string& title, const OVDate& date) {
    std::string text =
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<opml version=\"2.0\">\n  <head>\n"
        "    <title>" +
        escaped(title) + "</title>\n    <dateCreated>" + rfc822(date) +
        "</dateCreated>\n  </head>\n  <body>\n";
    Commands::write(outlines, 2, text);
    return text + "  </body>\n</opml>\n";
}

}  // namespace Commands
