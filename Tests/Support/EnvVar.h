#pragma once

#include <cstdlib>
#include <optional>
#include <string>

namespace Support {

/// Sets an environment variable, or unsets it with null, and puts the old value back at the end.
class EnvVar {
 public:
    EnvVar(const char* name, const char* value) : mName(name) {
        if (const char* old = std::getenv(name)) mOld = old;
        set(value);
    }
    ~EnvVar() { set(mOld ? mOld->c_str() : nullptr); }
    EnvVar(const EnvVar&) = delete;
    EnvVar& operator=(const EnvVar&) = delete;

 private:
    void set(const char* value) {
        if (value) {
            setenv(mName.c_str(), value, 1);
        } else {
            unsetenv(mName.c_str());
        }
    }

    std::string mName;
    std::optional<std::string> mOld;
};

}  // namespace Support
