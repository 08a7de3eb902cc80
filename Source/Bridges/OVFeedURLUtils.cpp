#include <Orvane/OVFeedURLUtils.h>

#include "Bridges/Barriers.h"
#include "Bridges/PublicValues.h"
#include "FeedParser/Text/FeedURLUtilsCore.h"

using namespace Foundation;
using namespace Orvane;
using Forms = FeedURLUtilsCore;
using Text = OVFeedURLUtils::Text;

namespace {

/// Null for what is no URL.
Ref<URL> parse(const Text& text) {
    const Ref<String> string = stringOf(text);
    return string.get() ? Ref<URL>(URL::url(string.get())) : nullptr;
}

Text textOfTaken(const Ref<URL>& url) {
    return textOf(url.get());
}

/// Reports whatever fails, also what cannot be taken, and gives none or false then.
template <class Body>
std::invoke_result_t<Body> quietly(const char* where, Body&& body) {
    try {
        return reporting(where, body);
    } catch (const ParameterException& exception) {
        doWarnAboutException(&exception, where);
    }
    return {};
}

}  // namespace

bool OVFeedURLUtils::_webIsFeedProtocolURL(const Text& url) {
    return quietly("+[OVFeedURLUtils _webIsFeedProtocolURL:]",
                   [&] { return Forms::isFeedProtocolURL(parse(url).get()); });
}

bool OVFeedURLUtils::_webIsFeedsProtocolURL(const Text& url) {
    return quietly("+[OVFeedURLUtils _webIsFeedsProtocolURL:]",
                   [&] { return Forms::isFeedsProtocolURL(parse(url).get()); });
}

bool OVFeedURLUtils::isKnownURL(const Text& url) {
    return quietly("+[OVFeedURLUtils isKnownURL:]",
                   [&] { return Forms::isKnownURL(parse(url).get()); });
}

Text OVFeedURLUtils::feedURLForSourceURL(const Text& url) {
    return quietly("+[OVFeedURLUtils feedURLForSourceURL:]",
                   [&] { return textOfTaken(Forms::feedURLForSourceURL(parse(url).get())); });
}

Text OVFeedURLUtils::sourceURLForFeedURL(const Text& url) {
    return quietly("+[OVFeedURLUtils sourceURLForFeedURL:]",
                   [&] { return textOfTaken(Forms::sourceURLForFeedURL(parse(url).get())); });
}

Text OVFeedURLUtils::aggregateFeedURLForURLs(const std::vector<std::string>& urls, const Text& name,
                                             const Text& uuid, const Text& filter) {
    return quietly("+[OVFeedURLUtils aggregateFeedURLForURLs:name:uuid:filter:]", [&]() -> Text {
        if (urls.empty()) return std::nullopt;
        const Ref<MutableArrayOf<URL>> list = MutableArrayOf<URL>::array();
        for (const std::string& url : urls) {
            list->add(urlOf(url).get());
        }
        return textOfTaken(Forms::aggregateFeedURLFromComponents(
            list.get(), stringOf(name).get(), stringOf(uuid).get(), stringOf(filter).get()));
    });
}

std::optional<OVFeedURLUtils::Aggregate> OVFeedURLUtils::parseAggregateFeedURL(const Text& url) {
    return quietly(
        "+[OVFeedURLUtils parseAggregateFeedURL:name:uuid:filter:]",
        [&]() -> std::optional<Aggregate> {
            Ref<String> name, uuid, filter;
            const Ref<URL> whole = parse(url);
            const Ref<Forms::URLs> urls =
                Forms::urlsFromAggregateFeedURL(whole.get(), name, uuid, filter);
            if (!urls.get()) return std::nullopt;
            Aggregate aggregate{{}, textOf(name.get()), textOf(uuid.get()), textOf(filter.get())};
            for (const URL* each : *urls) {
                aggregate.urls.push_back(each->text());
            }
            return aggregate;
        });
}

Text OVFeedURLUtils::unfilteredAggregateURL(const Text& url) {
    return quietly("+[OVFeedURLUtils unfilteredAggregateURL:]",
                   [&] { return textOfTaken(Forms::unfilteredAggregateURL(parse(url).get())); });
}

std::string OVFeedURLUtils::unfilteredAggregateURLString(const std::string& text) {
    return Forms::unfilteredAggregateURLString(text);
}
