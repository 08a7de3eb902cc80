#pragma once

/// The domain of the library's own errors.
inline constexpr char OVErrorDomain[] = "Orvane";

/// The codes of `OVErrorDomain`. Their numbers are kept in databases and never change.
enum OVErrorCode : int {
    OVInternalError = 1,        ///< something failed that should not have
    OVNotAFeedError = 2,        ///< what a URL gave is no feed
    OVFeedIDMismatchError = 3,  ///< two objects that should be of one feed are not
    OVInvalidRowIDError = 200,  ///< the object is not, or no longer, in the database
    OVReadOnlyError = 201,      ///< a property that only the agent may change
    OVAgentLaunchError = 202,   ///< the agent could not be started
    OVIPCError = 203,           ///< a call to the agent failed
};
