#include "Foundation/Data.h"
#include "Foundation/PropertyList.h"
#include "Foundation/Ref.h"
#include "Fuzz/FuzzTarget.h"

#include <string>

using namespace Foundation;

/// What is read is written, unless that is refused, and then reads as the same.
extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    std::string error;
    const Ref<PFRefCounted> value = PropertyList::read(Bytes(bytes, bytes + size), &error);
    require(!value || error.empty());
    if (!value) return 0;

    const Ref<Data> written = PropertyList::write(value.get(), &error);
    require(error.empty() == (written.get() != nullptr));
    if (!written) return 0;
    const Ref<PFRefCounted> again = PropertyList::read(written->asBytes(), &error);
    require(IsEqual(again.get(), value.get()));
    return 0;
}
