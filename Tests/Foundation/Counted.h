#pragma once

#include "Foundation/Ref.h"

#include <string>
#include <vector>

/// An object that writes every count on it into a log: "retain a", "release a", "autorelease a".
struct Counted {
    Counted(std::string objectName, std::vector<std::string>* countLog)
        : name(std::move(objectName)), log(countLog) {}

    void note(const char* what) const { log->push_back(std::string(what) + " " + name); }

    std::string name;
    std::vector<std::string>* log;
};

namespace Foundation {

template <>
struct Counting<Counted> {
    static void retain(const Counted* object) {
        if (object) object->note("retain");
    }
    static void release(const Counted* object) {
        if (object) object->note("release");
    }
    static void autorelease(const Counted* object) {
        if (object) object->note("autorelease");
    }
};

}  // namespace Foundation
