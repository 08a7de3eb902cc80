#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <string>
#include <string_view>

namespace Orvane {

/// A text that a function takes in any form that its caller has: a literal, a `String`, a view.
/// May be null. Not for keeping: it is a view.
class TextArgument {
 public:
    TextArgument(std::nullptr_t) {}
    TextArgument(const char* text) : mIsNull(!text), mView(text ? text : "") {}
    TextArgument(const Foundation::String* text)
        : mIsNull(!text), mView(Foundation::String::view(text)) {}
    TextArgument(const Foundation::Ref<Foundation::String>& text) : TextArgument(text.get()) {}
    TextArgument(const std::string& text) : mIsNull(false), mView(text) {}
    TextArgument(std::string_view text) : mIsNull(false), mView(text) {}

    bool isNull() const { return mIsNull; }
    bool isEmpty() const { return mView.empty(); }
    std::string_view view() const { return mView; }
    /// Whether the two are the same text, or both null.
    bool operator==(const TextArgument& other) const {
        return mIsNull == other.mIsNull && mView == other.mView;
    }

 private:
    bool mIsNull = true;
    std::string_view mView;
};

}  // namespace Orvane
