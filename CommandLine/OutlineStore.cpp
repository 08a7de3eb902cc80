#include "OutlineStore.h"

#include "DateText.h"
#include "Failure.h"
#include "OPML.h"
#include "Places.h"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <map>
#include <set>
#include <system_error>

namespace Commands {

namespace fs = std::filesystem;

namespace {

using Outlines = std::vector<Outline>;

/// The name of a file, whatever the client is called.
std::string fileName(const std::string& client) {
    std::string name;
    for (const char c : client) {
        const bool isPlain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') ||
                             (c >= '0' && c <= '9') || c == '.' || c == '-';
        name += isPlain ? c : '_';
    }
    return "Outlines-" + name + ".opml";
}

bool isSame(const Outline& a, const Outline& b) {
    if (a.isFeed() != b.isFeed()) return false;
    return a.isFeed() ? a.url == b.url : a.title == b.title;
}

void mergeInto(Outlines& into, const Outlines& more) {
    for (const Outline& each : more) {
        const auto found = std::find_if(into.begin(), into.end(),
                                        [&](const Outline& old) { return isSame(old, each); });
        if (found == into.end()) {
            into.push_back(each);
            into.back().children.clear();
            mergeInto(into.back().children, each.children);
            continue;
        }
        if (!each.title.empty()) found->title = each.title;
        if (!each.others.empty()) found->others = each.others;
        mergeInto(found->children, each.children);
    }
}

Outlines arrangedBelow(const Outlines& outlines, const std::map<std::string, const Outline*>& feeds,
                       std::set<std::string>& placed) {
    Outlines all;
    for (const Outline& each : outlines) {
        Outline outline = each;
        if (each.isFeed()) {
            const auto feed = feeds.find(each.url);
            if (feed == feeds.end()) continue;
            placed.insert(each.url);
            outline.page = feed->second->page;
            if (outline.title.empty()) outline.title = feed->second->title;
        } else {
            outline.children = arrangedBelow(each.children, feeds, placed);
            if (outline.children.empty()) continue;
        }
        all.push_back(std::move(outline));
    }
    return all;
}

}  // namespace

OutlineStore::OutlineStore(const std::string& client) : mFile(Places::own() / fileName(client)) {
    std::ifstream stream(mFile, std::ios::binary);
    const std::string text{std::istreambuf_iterator<char>(stream), {}};
    mOutlines = OPML::read(text).value_or(Outlines());
}

void OutlineStore::merge(const Outlines& outlines) {
    mergeInto(mOutlines, outlines);
}

void OutlineStore::save() const {
    std::error_code error;
    fs::create_directories(mFile.parent_path(), error);
    const fs::path next = mFile.string() + ".new";
    std::ofstream stream(next, std::ios::binary | std::ios::trunc);
    stream << OPML::write(mOutlines, "Folders of orvane", DateText::now());
    stream.close();
    if (stream) fs::rename(next, mFile, error);
    if (!stream || error) {
        throw Failure(ExitStatus::Failed, "the folders could not be kept in " + mFile.string() +
                                              "; is the disk full, or the folder not writable?");
    }
}

Outlines OutlineStore::arranged(const Outlines& outlines, const Outlines& feeds) {
    std::map<std::string, const Outline*> byURL;
    for (const Outline& feed : feeds) {
        byURL[feed.url] = &feed;
    }
    std::set<std::string> placed;
    Outlines all = arrangedBelow(outlines, byURL, placed);
    for (const Outline& feed : feeds) {
        if (!placed.contains(feed.url)) all.push_back(feed);
    }
    return all;
}

}  // namespace Commands
