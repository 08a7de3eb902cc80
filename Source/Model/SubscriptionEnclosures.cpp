#include "Foundation/MIMEType.h"
#include "Model/EnclosureCore.h"
#include "Model/SubscriptionCore.h"

#include <algorithm>
#include <string>
#include <string_view>

// Which enclosures a subscription wants to have downloaded.

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::MIMEType;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

Foundation::StringReturner SubscriptionCore::serializeEnclosureTypes(const ArrayOf<String>* types) {
    const Ref<String> tab = String::string("\t");
    return types ? String::stringByJoining(types, tab.get()) : String::string("");
}

Returner<ArrayOf<String>> SubscriptionCore::deserializeEnclosureTypes(const String* types) {
    if (!types) return nullptr;
    Ref<MutableArrayOf<String>> list = MutableArrayOf<String>::array();
    std::string_view rest = types->view();
    // The text of an empty list is empty.
    while (!rest.empty()) {
        const std::size_t tab = rest.find('\t');
        list->add(String::string(std::string(rest.substr(0, tab))));
        rest.remove_prefix(tab == std::string_view::npos ? rest.size() : tab + 1);
    }
    return Returner<MutableArrayOf<String>>(std::move(list));
}

Returner<ArrayOf<String>> SubscriptionCore::getEnclosureTypes() const {
    return deserializeEnclosureTypes(mEnclosureTypesString);
}

bool SubscriptionCore::willAutoDownload(const MIMEType* type) const {
    // An empty text is an empty list.
    if (String::isEmpty(mEnclosureTypesString)) return true;
    if (!type) return false;
    const Ref<ArrayOf<String>> types = getEnclosureTypes();
    return std::any_of(types->begin(), types->end(), [&](String* text) {
        const Ref<MIMEType> wanted = MIMEType::type(text);
        return type->isBaseEqual(wanted.get());
    });
}

bool SubscriptionCore::willAutoDownload(const EnclosureCore* enclosure) const {
    if (!mDownloadsEnclosures) return false;
    const double limit = mMaxEnclosureSize;
    if (limit != 0 && static_cast<double>(enclosure->mLength.getValue()) > limit) return false;
    const Ref<MIMEType> type = MIMEType::type(enclosure->mMIMEType);
    return willAutoDownload(type.get());
}

}  // namespace Orvane
