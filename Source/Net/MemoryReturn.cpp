#include "Net/MemoryReturn.h"

#include "Foundation/RunLoop.h"

#include <malloc.h>

namespace Orvane {

void MemoryReturn::soon(std::size_t bytes) {
    if (bytes < kWorthwhileBytes) return;
    Foundation::RunLoop::current().perform([] { malloc_trim(0); });
}

}  // namespace Orvane
