#pragma once

/// The domain of the library's own errors; its codes are of `OVErrorCode`.
inline constexpr char OVErrorDomain[] = "Orvane";

// The domains of errors that the library passes on.
inline constexpr char OVPOSIXErrorDomain[] = "POSIX";              ///< codes are of `errno`
inline constexpr char OVMachErrorDomain[] = "Mach";                ///< the agent's transport
inline constexpr char OVNetServicesErrorDomain[] = "NetServices";  ///< service discovery
inline constexpr char OVSOCKSErrorDomain[] = "SOCKS";
inline constexpr char OVSSLErrorDomain[] = "SSL";
inline constexpr char OVSystemConfigErrorDomain[] = "SystemConfig";
inline constexpr char OVURLErrorDomain[] = "URL";  ///< codes are of `OVURLErrorCode`
/// Codes are of `OVApplicationErrorCode`.
inline constexpr char OVApplicationErrorDomain[] = "Application";

/// The codes of `OVErrorDomain`. Databases keep their numbers, which never change.
enum OVErrorCode : int {
    OVInternalError = 1,        ///< something failed that should not have
    OVNotAFeedError = 2,        ///< what a URL gave is no feed
    OVFeedIDMismatchError = 3,  ///< two objects that should be of one feed are not
    OVInvalidRowIDError = 200,  ///< the object is not, or no longer, in the database
    OVReadOnlyError = 201,      ///< a property that only the agent may change
    OVAgentLaunchError = 202,   ///< the agent could not be started
    OVIPCError = 203,           ///< a call to the agent failed
};

/// The codes of `OVURLErrorDomain`: what can go wrong with loading a URL.
enum OVURLErrorCode : int {
    OVURLErrorUnknown = -1,
    OVURLErrorCancelled = -999,
    OVURLErrorBadURL = -1000,
    OVURLErrorTimedOut = -1001,
    OVURLErrorUnsupportedURL = -1002,
    OVURLErrorCannotFindHost = -1003,
    OVURLErrorCannotConnectToHost = -1004,
    OVURLErrorNetworkConnectionLost = -1005,
    OVURLErrorDNSLookupFailed = -1006,
    OVURLErrorTooManyRedirects = -1007,
    OVURLErrorResourceUnavailable = -1008,
    OVURLErrorNotConnected = -1009,
    OVURLErrorBadRedirect = -1010,
    OVURLErrorBadServerResponse = -1011,
    OVURLErrorUserCancelledAuthentication = -1012,
    OVURLErrorUserAuthenticationRequired = -1013,
    OVURLErrorFileDoesNotExist = -1100,
    OVURLErrorFileIsDirectory = -1101,
    OVURLErrorNoPermission = -1102,
    OVURLErrorSecureConnectionFailed = -1200,
    OVURLErrorCannotWriteFile = -3003,
};

/// The codes of `OVApplicationErrorDomain`.
enum OVApplicationErrorCode : int {
    OVUserCancelledError = 3072,  ///< somebody cancelled the work; nothing needs to be reported
};
