#pragma once

#include "Support/EnvVar.h"

#include <clocale>

namespace Support {

/// Makes texts come out in a language while it lives. Needs no locale of that language: the one
/// that every system has in UTF-8 is enough for gettext to heed LANGUAGE.
class Language {
 public:
    explicit Language(const char* language) : mVariable("LANGUAGE", language) {
        // Also what makes gettext look anew.
        std::setlocale(LC_ALL, "C.UTF-8");
    }
    ~Language() { std::setlocale(LC_ALL, "C"); }
    Language(const Language&) = delete;
    Language& operator=(const Language&) = delete;

 private:
    EnvVar mVariable;
};

}  // namespace Support
