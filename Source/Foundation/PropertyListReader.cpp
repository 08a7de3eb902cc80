#include "Foundation/PropertyListReader.h"

#include "Foundation/Base64.h"
#include "Foundation/Data.h"
#include "Foundation/Number.h"
#include "Foundation/PropertyList.h"
#include "Foundation/PropertyListScalars.h"
#include "Foundation/String.h"

#include <glib.h>
#include <algorithm>
#include <memory>

namespace Foundation {

namespace {

constexpr std::string_view kLeaves[] = {"key",  "string", "integer", "real",
                                        "true", "false",  "date",    "data"};
constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

Returner<PFRefCounted> leafValue(std::string_view name, std::string text) {
    if (name == "string") return String::string(std::move(text));
    if (name == "data") return Data::adopt(Base64::decode(text));
    if (name == "integer") return Number::number(PropertyListScalars::readInteger(text));
    if (name == "real") return Number::number(PropertyListScalars::readReal(text));
    if (name == "date") return PropertyListScalars::readDate(text);
    return Number::number(name == "true");
}

}  // namespace

/// The parser's C callbacks.
struct PropertyListReader::Callbacks {
    static PropertyListReader& reader(gpointer data) {
        return *static_cast<PropertyListReader*>(data);
    }
    static void start(GMarkupParseContext* context, const gchar* name, const gchar**, const gchar**,
                      gpointer data, GError** error) {
        reader(data).guarded(context, error, [&] { reader(data).startElement(name); });
    }
    static void end(GMarkupParseContext* context, const gchar* name, gpointer data,
                    GError** error) {
        reader(data).guarded(context, error, [&] { reader(data).endElement(name); });
    }
    static void text(GMarkupParseContext* context, const gchar* text, gsize length, gpointer data,
                     GError** error) {
        reader(data).guarded(context, error, [&] { reader(data).text({text, length}); });
    }
};

Returner<PFRefCounted> PropertyListReader::read(std::string_view xml) {
    static constexpr GMarkupParser kParser = {Callbacks::start, Callbacks::end, Callbacks::text,
                                              nullptr, nullptr};
    if (xml.empty()) throw PropertyListError("there is no text");
    if (xml.starts_with(kByteOrderMark)) xml.remove_prefix(kByteOrderMark.size());
    const std::unique_ptr<GMarkupParseContext, void (*)(GMarkupParseContext*)> context(
        g_markup_parse_context_new(&kParser, G_MARKUP_TREAT_CDATA_AS_TEXT, this, nullptr),
        g_markup_parse_context_free);
    GError* rawError = nullptr;
    const bool isRead = g_markup_parse_context_parse(context.get(), xml.data(),
                                                     static_cast<gssize>(xml.size()), &rawError) &&
                        g_markup_parse_context_end_parse(context.get(), &rawError);
    const std::unique_ptr<GError, void (*)(GError*)> error(rawError, g_error_free);
    if (mFailure) std::rethrow_exception(mFailure);
    if (!isRead) throw PropertyListError(error ? error->message : "the text is no XML");
    if (!mHasValue) throw PropertyListError("there is no plist element");
    return Returner<PFRefCounted>(std::move(mValue));
}

template <class Step>
void PropertyListReader::guarded(GMarkupParseContext* context, GError** error, Step step) noexcept {
    try {
        try {
            step();
        } catch (const PropertyListError& wrong) {
            gint line = 0;
            g_markup_parse_context_get_position(context, &line, nullptr);
            throw PropertyListError("line " + std::to_string(line) + ": " + wrong.what());
        }
    } catch (...) {
        mFailure = std::current_exception();
        g_set_error_literal(error, G_MARKUP_ERROR, G_MARKUP_ERROR_INVALID_CONTENT, "refused");
    }
}

void PropertyListReader::startElement(std::string_view name) {
    if (mLeaf) throw PropertyListError(*mLeaf + " holds another element");
    if (!mIsInside) {
        if (name != "plist") throw PropertyListError("the root element is not plist");
        mIsInside = true;
    } else if (name == "array" || name == "dict") {
        checkPlace();
        startContainer(name);
    } else if (std::find(std::begin(kLeaves), std::end(kLeaves), name) != std::end(kLeaves)) {
        if (name != "key") checkPlace();
        mLeaf = name;
        mText.clear();
    } else {
        throw PropertyListError("unknown element " + std::string(name));
    }
}

/// Whether a value may stand here.
void PropertyListReader::checkPlace() const {
    if (mContainers.empty()) {
        if (mHasValue) throw PropertyListError("more than one value");
    } else if (mContainers.back().dictionary && !mContainers.back().key) {
        throw PropertyListError("a value without a key");
    }
}

void PropertyListReader::startContainer(std::string_view name) {
    if (mContainers.size() == PropertyList::kMaxDepth) throw PropertyListError("too deep");
    Container container;
    if (name == "array") {
        container.array = MutableArrayOf<PFRefCounted>::array();
    } else {
        container.dictionary = MutableDictionary::dictionary();
    }
    mContainers.push_back(std::move(container));
}

void PropertyListReader::endElement(std::string_view) {
    if (!mLeaf) {
        if (!mContainers.empty()) return endContainer();
        // Checked here, since the parser would go on to another root element.
        if (!mHasValue) throw PropertyListError("the plist element is empty");
        return;
    }
    const std::string name = *mLeaf;
    mLeaf.reset();
    if (name == "key") {
        endKey();
    } else {
        const Ref<PFRefCounted> value = leafValue(name, std::move(mText));
        place(value);
    }
}

void PropertyListReader::endKey() {
    if (mContainers.empty() || !mContainers.back().dictionary) {
        throw PropertyListError("a key outside a dictionary");
    }
    if (mContainers.back().key) throw PropertyListError("a key without a value");
    mContainers.back().key = std::move(mText);
}

void PropertyListReader::endContainer() {
    const Container ended = std::move(mContainers.back());
    mContainers.pop_back();
    if (ended.key) throw PropertyListError("a key without a value");
    place(ended.array ? static_cast<PFRefCounted*>(ended.array.get()) : ended.dictionary.get());
}

void PropertyListReader::place(PFRefCounted* value) {
    if (mContainers.empty()) {
        mValue = value;
        mHasValue = true;
        return;
    }
    Container& container = mContainers.back();
    if (container.array) {
        container.array->add(value);
    } else {
        container.dictionary->set(*container.key, value);
        container.key.reset();
    }
}

void PropertyListReader::text(std::string_view text) {
    if (mLeaf) {
        mText += text;
    } else if (!PropertyListScalars::trim(text).empty()) {
        throw PropertyListError("text outside a value");
    }
}

}  // namespace Foundation
