#include "Bridges/FileTypes.h"

#include <strings.h>

namespace Orvane {

namespace {

struct FileType {
    std::string_view extension;
    const char* mimeType;
};

// What feeds have attached. A table of our own, as that of the system need not be there.
constexpr FileType kTypes[] = {
    {"aac", "audio/aac"},
    {"aif", "audio/aiff"},
    {"aiff", "audio/aiff"},
    {"avi", "video/x-msvideo"},
    {"epub", "application/epub+zip"},
    {"flac", "audio/flac"},
    {"gif", "image/gif"},
    {"gz", "application/gzip"},
    {"htm", "text/html"},
    {"html", "text/html"},
    {"jpeg", "image/jpeg"},
    {"jpg", "image/jpeg"},
    {"m4a", "audio/mp4"},
    {"m4b", "audio/mp4"},
    {"m4v", "video/mp4"},
    {"mkv", "video/x-matroska"},
    {"mov", "video/quicktime"},
    {"mp3", "audio/mpeg"},
    {"mp4", "video/mp4"},
    {"mpeg", "video/mpeg"},
    {"mpg", "video/mpeg"},
    {"oga", "audio/ogg"},
    {"ogg", "audio/ogg"},
    {"ogv", "video/ogg"},
    {"opus", "audio/opus"},
    {"pdf", "application/pdf"},
    {"png", "image/png"},
    {"svg", "image/svg+xml"},
    {"torrent", "application/x-bittorrent"},
    {"txt", "text/plain"},
    {"wav", "audio/wav"},
    {"webm", "video/webm"},
    {"webp", "image/webp"},
    {"xml", "application/xml"},
    {"zip", "application/zip"},
};

}  // namespace

const char* mimeTypeOfExtension(std::string_view extension) {
    for (const FileType& type : kTypes) {
        if (type.extension.size() == extension.size() &&
            strncasecmp(type.extension.data(), extension.data(), extension.size()) == 0) {
            return type.mimeType;
        }
    }
    return nullptr;
}

}  // namespace Orvane
