#pragma once

#include <Orvane/OVBase.h>
#include <Orvane/OVErrorCode.h>

#include <map>
#include <string>
#include <utility>

/// An error for people: a domain, a code of that domain, and texts that explain it. A plain value.
///
/// Texts are UTF-8 in the language of the process; an empty one is one that the error has not got.
class OVError {
 public:
    /// An error without texts.
    OVError(std::string domain, int code) : mDomain(std::move(domain)), mCode(code) {}

    /// Whose error it is, and which of his: see `OVErrorCode.h`.
    const std::string& domain() const { return mDomain; }
    int code() const { return mCode; }

    /// What happened, as a sentence.
    const std::string& description() const { return mDescription; }
    void setDescription(std::string text) { mDescription = std::move(text); }
    /// Why it happened.
    const std::string& failureReason() const { return mFailureReason; }
    void setFailureReason(std::string text) { mFailureReason = std::move(text); }
    /// What can be done about it.
    const std::string& recoverySuggestion() const { return mRecoverySuggestion; }
    void setRecoverySuggestion(std::string text) { mRecoverySuggestion = std::move(text); }
    /// The URL that could not be loaded.
    const std::string& URL() const { return mURL; }
    void setURL(std::string url) { mURL = std::move(url); }
    /// Numbers that tell more, by keys which the domain explains.
    const std::map<std::string, int>& userInfo() const { return mUserInfo; }
    void setUserInfo(std::map<std::string, int> info) { mUserInfo = std::move(info); }

    /// By all of these.
    bool operator==(const OVError&) const = default;

    /// A text for logs: the description, if there is one, with domain and code.
    OV_EXPORT std::string toString() const;

 private:
    std::string mDomain;
    int mCode;
    std::string mDescription;
    std::string mFailureReason;
    std::string mRecoverySuggestion;
    std::string mURL;
    std::map<std::string, int> mUserInfo;
};

/// Makes errors arguments of `%@`.
OV_EXPORT std::string describeForFormat(const OVError* error);
