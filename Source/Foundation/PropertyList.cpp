#include "Foundation/PropertyList.h"

#include "Foundation/Data.h"
#include "Foundation/PropertyListReader.h"
#include "Foundation/PropertyListWriter.h"

namespace Foundation {

namespace {

/// Runs `work` and gives its result, or null and the text of the error that it throws.
template <class Work>
auto withError(std::string* error, Work work) -> decltype(work()) {
    if (error) error->clear();
    try {
        return work();
    } catch (const PropertyListError& wrong) {
        if (error) *error = wrong.what();
        return nullptr;
    }
}

}  // namespace

Returner<PFRefCounted> PropertyList::read(Bytes xml, std::string* error) {
    return withError(error, [&] { return PropertyListReader().read(xml.view()); });
}

DataReturner PropertyList::write(const PFRefCounted* value, std::string* error) {
    return withError(error, [&] { return Data::adopt(PropertyListWriter().write(value)); });
}

}  // namespace Foundation
