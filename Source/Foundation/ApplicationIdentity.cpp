#include "Foundation/ApplicationIdentity.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/DesktopLaunch.h"

#include <gio/gio.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <mutex>

namespace Foundation {

namespace {

std::string textOf(const char* text) {
    return text ? text : "";
}

std::string gioApplicationID() {
    GApplication* application = g_application_get_default();
    return application ? textOf(g_application_get_application_id(application)) : "";
}

std::string launchedDesktopFile() {
    return DesktopLaunch::identifier(textOf(std::getenv(DesktopLaunch::kFileVariable)),
                                     textOf(std::getenv(DesktopLaunch::kProcessVariable)),
                                     getpid());
}

std::string programName() {
    const std::string name = textOf(g_get_prgname());
    if (!name.empty()) return name;
    std::error_code error;
    const std::filesystem::path executable = std::filesystem::read_symlink("/proc/self/exe", error);
    return error ? textOf(program_invocation_short_name) : executable.filename().string();
}

bool isValidUTF8(const std::string& text) {
    return g_utf8_validate_len(text.data(), text.size(), nullptr);
}

/// What comes from the surroundings may be in any encoding.
std::string validUTF8(const std::string& text) {
    char* valid = g_utf8_make_valid(text.data(), static_cast<gssize>(text.size()));
    std::string result = valid;
    g_free(valid);
    return result;
}

std::string determine() {
    for (const auto source : {gioApplicationID, launchedDesktopFile, programName}) {
        const std::string found = source();
        if (!found.empty()) return validUTF8(found);
    }
    return ApplicationIdentity::kUnknown;
}

/// Empty as long as nothing has asked.
struct Known {
    std::mutex mutex;
    std::string identifier;
};

/// Never destroyed: statics may ask at the process's end.
Known& known() {
    static auto* const sKnown = new Known;
    return *sKnown;
}

}  // namespace

std::string ApplicationIdentity::getIdentifier() {
    Known& state = known();
    const std::lock_guard lock(state.mutex);
    if (state.identifier.empty()) state.identifier = determine();
    return state.identifier;
}

void ApplicationIdentity::setIdentifier(const std::string& wanted) {
    OV_ASSERT_MESSAGE(!wanted.empty() && isValidUTF8(wanted),
                      "an application's identifier must be a text");
    Known& state = known();
    std::unique_lock lock(state.mutex);
    if (state.identifier.empty()) state.identifier = wanted;
    const std::string held = state.identifier;
    // What reports a failed assertion may ask who we are.
    lock.unlock();
    OV_ASSERT_MESSAGE(held == wanted, "the application is known as %s already and can't become %s",
                      held, wanted);
}

void ApplicationIdentity::_forget() {
    Known& state = known();
    const std::lock_guard lock(state.mutex);
    state.identifier.clear();
}

}  // namespace Foundation
