#include "Foundation/NetError.h"

#include <gio/gio.h>

#include <cerrno>

namespace Foundation {

namespace {

struct Mapping {
    int code;
    std::int32_t target;
};

// GLib keeps no `errno` in its errors: each of its codes gets the one it is chiefly made from.
constexpr Mapping kFileErrors[] = {
    {G_FILE_ERROR_EXIST, EEXIST}, {G_FILE_ERROR_ISDIR, EISDIR},
    {G_FILE_ERROR_ACCES, EACCES}, {G_FILE_ERROR_NAMETOOLONG, ENAMETOOLONG},
    {G_FILE_ERROR_NOENT, ENOENT}, {G_FILE_ERROR_NOTDIR, ENOTDIR},
    {G_FILE_ERROR_NXIO, ENXIO},   {G_FILE_ERROR_NODEV, ENODEV},
    {G_FILE_ERROR_ROFS, EROFS},   {G_FILE_ERROR_TXTBSY, ETXTBSY},
    {G_FILE_ERROR_FAULT, EFAULT}, {G_FILE_ERROR_LOOP, ELOOP},
    {G_FILE_ERROR_NOSPC, ENOSPC}, {G_FILE_ERROR_NOMEM, ENOMEM},
    {G_FILE_ERROR_MFILE, EMFILE}, {G_FILE_ERROR_NFILE, ENFILE},
    {G_FILE_ERROR_BADF, EBADF},   {G_FILE_ERROR_INVAL, EINVAL},
    {G_FILE_ERROR_PIPE, EPIPE},   {G_FILE_ERROR_AGAIN, EAGAIN},
    {G_FILE_ERROR_INTR, EINTR},   {G_FILE_ERROR_IO, EIO},
    {G_FILE_ERROR_PERM, EPERM},   {G_FILE_ERROR_NOSYS, ENOSYS},
    {G_FILE_ERROR_FAILED, EIO},
};

constexpr Mapping kIOErrors[] = {
    {G_IO_ERROR_FAILED, EIO},
    {G_IO_ERROR_NOT_FOUND, ENOENT},
    {G_IO_ERROR_EXISTS, EEXIST},
    {G_IO_ERROR_IS_DIRECTORY, EISDIR},
    {G_IO_ERROR_NOT_DIRECTORY, ENOTDIR},
    {G_IO_ERROR_NOT_EMPTY, ENOTEMPTY},
    {G_IO_ERROR_FILENAME_TOO_LONG, ENAMETOOLONG},
    {G_IO_ERROR_TOO_MANY_LINKS, ELOOP},
    {G_IO_ERROR_NO_SPACE, ENOSPC},
    {G_IO_ERROR_INVALID_ARGUMENT, EINVAL},
    {G_IO_ERROR_PERMISSION_DENIED, EACCES},
    {G_IO_ERROR_NOT_SUPPORTED, ENOTSUP},
    {G_IO_ERROR_CANCELLED, ECANCELED},
    {G_IO_ERROR_READ_ONLY, EROFS},
    {G_IO_ERROR_TIMED_OUT, ETIMEDOUT},
    {G_IO_ERROR_BUSY, EBUSY},
    {G_IO_ERROR_WOULD_BLOCK, EAGAIN},
    {G_IO_ERROR_TOO_MANY_OPEN_FILES, EMFILE},
    {G_IO_ERROR_ADDRESS_IN_USE, EADDRINUSE},
    {G_IO_ERROR_CONNECTION_REFUSED, ECONNREFUSED},
    {G_IO_ERROR_BROKEN_PIPE, EPIPE},
    {G_IO_ERROR_NOT_CONNECTED, ENOTCONN},
    {G_IO_ERROR_NETWORK_UNREACHABLE, ENETUNREACH},
    {G_IO_ERROR_HOST_UNREACHABLE, EHOSTUNREACH},
    {G_IO_ERROR_MESSAGE_TOO_LARGE, EMSGSIZE},
    {G_IO_ERROR_NO_SUCH_DEVICE, ENODEV},
};

constexpr std::int32_t kCannotFindHost = -1003;
constexpr std::int32_t kNameLookupFailed = -1006;

constexpr Mapping kIOErrorsOfURLs[] = {{G_IO_ERROR_HOST_NOT_FOUND, kCannotFindHost}};
constexpr Mapping kResolverErrors[] = {
    {G_RESOLVER_ERROR_NOT_FOUND, kCannotFindHost},
    {G_RESOLVER_ERROR_TEMPORARY_FAILURE, kNameLookupFailed},
    {G_RESOLVER_ERROR_INTERNAL, kNameLookupFailed},
};

template <std::size_t N>
std::int32_t find(const Mapping (&mappings)[N], int code) {
    for (const Mapping& mapping : mappings) {
        if (mapping.code == code) return mapping.target;
    }
    return 0;
}

NetError convert(const GError& error) {
    if (error.domain == G_FILE_ERROR) {
        if (const auto number = find(kFileErrors, error.code)) return {NetError::kPOSIX, number};
    } else if (error.domain == G_IO_ERROR) {
        if (const auto number = find(kIOErrors, error.code)) return {NetError::kPOSIX, number};
        if (const auto number = find(kIOErrorsOfURLs, error.code)) {
            return {NetError::kPFURL, number};
        }
    } else if (error.domain == G_RESOLVER_ERROR) {
        if (const auto number = find(kResolverErrors, error.code)) {
            return {NetError::kPFURL, number};
        }
    }
    return {NetError::kCustom, error.code ? error.code : -1};
}

}  // namespace

NetError::NetError(const GError* error) : NetError(error ? convert(*error) : None) {}

}  // namespace Foundation
