#include <Orvane/OVContent.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVContentInternal.h"
#include "Bridges/OVObjectMaker.h"
#include "Bridges/PublicValues.h"
#include "Foundation/MIMEType.h"
#include "Utilities/XMLElement.h"

#include <Orvane/OVFormat.h>

using namespace Foundation;
using namespace Orvane;

namespace {

std::shared_ptr<OVContent> makeContent(std::string_view bytes, const Ref<String>& type) {
    const Ref<ContentCore> core = Returner<ContentCore>::adopted(new ContentCore);
    const Ref<Data> data = Data::data(bytes.data(), bytes.size());
    core->mData.setValue(data.get());
    core->mMIMEType.setValue(type.get());
    return OVObjectMaker::makeFor<OVContent, OVContentInternal>(core.get());
}

/// The text of HTML; the HTML itself if it cannot be read.
Ref<String> plainTextOf(String* html) {
    const Ref<String> wrapped = String::stringWithFormat("<div>%@</div>", html);
    const Ref<Data> data = wrapped->getData();
    std::string error;
    const Ref<XMLElement> root = XMLElement::elementWithHTML(data.get(), &error);
    if (!root.get()) {
        gWarn.log("Couldn't create PNXMLDocument from string \"%@\": %s", wrapped, error);
        return html;
    }
    const Ref<String> text = root->getStringValue();
    return text->getTrimmedString();
}

}  // namespace

OVContent::OVContent(std::unique_ptr<OVContentInternal> internal)
    : mInternal(std::move(internal)) {}

OVContent::~OVContent() = default;

std::shared_ptr<OVContent> OVContent::create(std::string_view data, const std::string& MIMEType) {
    requireParameter(data.data() != nullptr, "-[OVContent initWithData:MIMEType:]", "itsData");
    requireParameter(!MIMEType.empty(), "-[OVContent initWithData:MIMEType:]", "itsMIMEType");
    return raising("-[OVContent initWithData:MIMEType:]",
                   [&] { return makeContent(data, stringOf(MIMEType)); });
}

std::shared_ptr<OVContent> OVContent::createFromText(const std::string& text) {
    return raising("-[OVContent initWithString:]", [&] {
        const Ref<String> string = stringOf(text);
        return makeContent(string->view(), Foundation::MIMEType::textPlain()->getString());
    });
}

std::shared_ptr<OVContent> OVContent::createFromHTML(const std::string& html) {
    return raising("-[OVContent initWithHTMLString:]", [&] {
        const Ref<String> string = stringOf(html);
        return makeContent(string->view(), Foundation::MIMEType::textHTML()->getString());
    });
}

OVContent::Text OVContent::MIMEType() const {
    return raising("-[OVContent MIMEType]",
                   [&] { return textOf(mInternal->core().mMIMEType.getValue()); });
}

OVContent::Text OVContent::data() const {
    return raising("-[OVContent data]", [&] { return bytesOf(mInternal->core().getData()); });
}

bool OVContent::isTextual() const {
    return raising("-[OVContent isTextual]", [&] { return mInternal->core().isTextString(); });
}

OVContent::Text OVContent::HTMLString() const {
    return raising("-[OVContent HTMLString]",
                   [&] { return textOf(mInternal->core().getHTMLString()); });
}

OVContent::Text OVContent::plainTextString() const {
    return raising("-[OVContent plainTextString]", [&]() -> Text {
        const ContentCore& core = mInternal->core();
        if (core.isPlainTextString()) return textOf(core.getPlainTextString());
        if (!core.isHTMLString()) return std::nullopt;
        String* html = core.getHTMLString();
        if (!html) return std::nullopt;
        // The core keeps the text for as long as the content stays what it is.
        if (!mInternal->plainTextCache.get() || mInternal->plainTextSource.get() != html) {
            mInternal->plainTextCache = plainTextOf(html);
            mInternal->plainTextSource = html;
        }
        return textOf(mInternal->plainTextCache.get());
    });
}

std::string OVContent::description() const {
    return raising("-[OVContent description]", [&] {
        const ContentCore& core = mInternal->core();
        const Data* data = core.getData();
        return OVFormat("%s[%@, %lu bytes]", "OVContent", core.mMIMEType.getValue(),
                        static_cast<unsigned long>(Data::asBytes(data).getLength()));
    });
}

bool OVContent::isEqual(const OVObject* other) const {
    const auto* content = dynamic_cast<const OVContent*>(other);
    return content && IsEqual(mInternal->peek(), content->mInternal->peek());
}

std::size_t OVContent::hash() const {
    return mInternal->peek()->getPFHashCode();
}
