#include "Bridges/PublicValues.h"

#include "Bridges/ParameterException.h"

using namespace Foundation;

namespace Orvane {

std::optional<std::string> textOf(const String* string) {
    if (!string) return std::nullopt;
    return string->utf8();
}

std::optional<std::string> textOf(const URL* url) {
    if (!url) return std::nullopt;
    const Ref<String> text = url->getAbsoluteString();
    return text->utf8();
}

std::optional<std::string> textOf(const TimeZone* zone) {
    if (!zone) return std::nullopt;
    return zone->getName();
}

std::optional<std::string> bytesOf(const Data* data) {
    if (!data) return std::nullopt;
    return std::string(data->view());
}

std::optional<OVDate> dateOf(const Date* date) {
    if (!date) return std::nullopt;
    return OVDate(date->getAbsoluteTime());
}

Ref<String> stringOf(const std::string& text) {
    Ref<String> string = String::stringOfUTF8(text);
    if (!string.get()) throw ParameterException("A text is not UTF-8");
    return string;
}

Ref<String> stringOf(const std::optional<std::string>& text) {
    return text ? stringOf(*text) : nullptr;
}

Ref<URL> urlOf(const std::string& text) {
    const Ref<String> string = stringOf(text);
    Ref<URL> url = URL::url(string.get());
    if (!url.get()) url = URL::lenientURL(string.get(), nullptr);
    if (!url.get() || !url->hasScheme()) throw ParameterException("Not an absolute URL: " + text);
    return url;
}

Ref<URL> urlOf(const std::optional<std::string>& text) {
    return text && !text->empty() ? urlOf(*text) : nullptr;
}

Ref<Date> dateOf(const std::optional<OVDate>& date) {
    return date ? Ref<Date>(Date::date(date->absoluteTime())) : nullptr;
}

Ref<ArrayOf<String>> stringsOf(const std::optional<std::vector<std::string>>& texts) {
    if (!texts) return nullptr;
    const Ref<MutableArrayOf<String>> list = MutableArrayOf<String>::array();
    for (const std::string& text : *texts) {
        const Ref<String> string = stringOf(text);
        list->add(string.get());
    }
    return Ref<ArrayOf<String>>(list.get());
}

}  // namespace Orvane
