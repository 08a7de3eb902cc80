#include "Foundation/Switches.h"

#include "Foundation/PreferenceSwitches.h"
#include "Foundation/Utils.h"

#include <cstring>

namespace Foundation {

bool GetBoolEnv(const char* name) {
    char value[3];
    if (!Compatibility::Utils::copyenv(value, sizeof value, name)) return false;
    if (value[0] == '0') return false;
    return !((value[0] == 'n' || value[0] == 'N') && (value[1] == 'o' || value[1] == 'O'));
}

bool GetBoolPref(const char* name, bool defaultValue) {
    char value[101];
    if (!Compatibility::Utils::copyenv(value, sizeof value, name)) {
        return PreferenceSwitches::read(name).value_or(defaultValue);
    }
    return std::strcmp(value, "NO") != 0 && std::strcmp(value, "0") != 0;
}

}  // namespace Foundation
