#include "Utilities/FileIcons.h"

#include <gio/gio.h>
#include <unistd.h>

#include <memory>
#include <vector>

namespace Orvane {

namespace {

using Text = std::unique_ptr<char, void (*)(void*)>;

/// The folders of a theme that hold icons of file types, best size first.
constexpr const char* kSizes[] = {"48x48", "64x64", "32x32", "scalable", "256x256", "16x16"};
/// The themes that desktops bring. All others build on one of these.
constexpr const char* kThemes[] = {"Adwaita", "gnome", "Papirus", "hicolor"};

/// The desktop's name for the type of a file.
Text contentType(const std::string& mimeType, const std::string& name) {
    if (!mimeType.empty()) {
        Text type(g_content_type_from_mime_type(mimeType.c_str()), g_free);
        if (type && !g_content_type_is_unknown(type.get())) return type;
    }
    const std::string fileName = name.find('.') == std::string::npos ? "file." + name : name;
    return {g_content_type_guess(fileName.c_str(), nullptr, 0, nullptr), g_free};
}

std::vector<std::string> iconFolders() {
    std::vector<std::string> folders = {g_get_user_data_dir()};
    for (const char* const* folder = g_get_system_data_dirs(); *folder; ++folder) {
        folders.emplace_back(*folder);
    }
    return folders;
}

/// The file of an icon in any theme; empty if there is none.
std::string findIcon(const std::vector<std::string>& folders, const std::string& icon) {
    for (const std::string& folder : folders) {
        for (const char* theme : kThemes) {
            for (const char* size : kSizes) {
                for (const char* suffix : {".png", ".svg"}) {
                    const Text path(g_build_filename(folder.c_str(), "icons", theme, size,
                                                     "mimetypes", (icon + suffix).c_str(), nullptr),
                                    g_free);
                    if (access(path.get(), R_OK) == 0) return path.get();
                }
            }
        }
    }
    return {};
}

}  // namespace

std::string FileIcons::find(const std::string& mimeType, const std::string& name) {
    const Text type = contentType(mimeType, name);
    const std::unique_ptr<GIcon, void (*)(void*)> icon(g_content_type_get_icon(type.get()),
                                                       g_object_unref);
    if (!G_IS_THEMED_ICON(icon.get())) return {};
    const std::vector<std::string> folders = iconFolders();
    const char* const* names = g_themed_icon_get_names(G_THEMED_ICON(icon.get()));
    for (; names && *names; ++names) {
        std::string path = findIcon(folders, *names);
        if (!path.empty()) return path;
    }
    return {};
}

}  // namespace Orvane
