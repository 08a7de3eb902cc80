#pragma once

#include "FeedParser/Text/Tidier.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"

#include <string>

/// A tidier, asked in texts.
template <class T>
class TidierAsked {
 public:
    static constexpr int kUTF8 = 1;

    explicit TidierAsked(std::string base = {}) : mBase(std::move(base)) {}

    /// What tidying in this process gives; "(null)" for a failure.
    std::string operator()(const std::string& markup, int encoding = kUTF8) {
        const Foundation::AutoreleasePool pool;
        const Foundation::Ref<Foundation::URL> base =
            Foundation::URL::url(Foundation::String::string(mBase));
        const Orvane::FeedParser::TidyResult result =
            mTidier->tidyHere(markup, encoding, base.get());
        return result.isSuccess() ? result.output : "(null)";
    }

    /// What tidying gives, wherever that is done.
    std::string tidy(const std::string& markup, int encoding = kUTF8) {
        const Foundation::AutoreleasePool pool;
        const Foundation::Ref<Foundation::Data> data =
            Foundation::Data::data(markup.data(), markup.size());
        const Foundation::Ref<Foundation::URL> base =
            Foundation::URL::url(Foundation::String::string(mBase));
        const Foundation::Ref<Foundation::Data> tidied =
            mTidier->tidy(data.get(), encoding, base.get());
        return tidied ? std::string(tidied->view()) : "(null)";
    }

    T& tidier() { return *mTidier; }

 private:
    std::string mBase;
    Foundation::Ref<T> mTidier = Foundation::Returner<T>::adopted(new T);
};
