#pragma once

#include "Support/TempDir.h"

#include <string>

namespace Support {

/// Certificates of servers, made anew for the test, of an authority of the test's own.
class Certificates {
 public:
    /// Kinds of them, all for "localhost" and 127.0.0.1 if nothing else is said.
    enum class Kind {
        Good,
        Expired,
        SelfSigned,  ///< by nobody whom anybody trusts
        WrongName,   ///< for another host
    };
    static constexpr int kKinds = 4;

    Certificates();

    /// The authority's own, in PEM: what a client has to trust.
    std::string authorityPath() const { return mDirectory / "authority.pem"; }
    std::string certificatePath(Kind kind) const;
    /// The private key for all of them.
    std::string keyPath() const { return mDirectory / "key.pem"; }

 private:
    void sign(Kind kind, const std::string& names, const std::string& from, const std::string& to);
    void openssl(const std::string& arguments) const;

    TempDir mDirectory;
};

}  // namespace Support
