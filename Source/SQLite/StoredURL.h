#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <utility>

namespace SQLite {

/// The value of a column of URLs: parsed when it is first asked for, as most that are read never
/// are, and parsing costs as much as reading the rest of a row.
class StoredURL {
 public:
    StoredURL() = default;
    explicit StoredURL(Foundation::StringReturner text) : mText(std::move(text)) {}

    Foundation::URL* get() const {
        if (mText.get()) {
            const Foundation::Ref<Foundation::String> text = std::move(mText);
            mURL = Foundation::URL::url(text.get());
        }
        return mURL.get();
    }
    StoredURL& operator=(Foundation::URL* url) {
        mText = nullptr;
        mURL = url;
        return *this;
    }

 private:
    mutable Foundation::Ref<Foundation::String> mText;  ///< null once it is parsed
    mutable Foundation::Ref<Foundation::URL> mURL;
};

}  // namespace SQLite
