#pragma once

#include "Foundation/MutableString.h"

struct _xmlNode;

namespace Orvane {

/// Appends the readable text of a node of libxml2 and of what is below it, a blank behind each
/// piece. Leaves out elements with "script", "style", "object", "img" or "head" in their name, in
/// any case: `header`, too. Null nodes have no text.
///
/// `unused` is for callers that hand a context through.
void _contentFromLibxml2Node(const _xmlNode* node, Foundation::MutableString* output,
                             void* unused = nullptr);

}  // namespace Orvane
