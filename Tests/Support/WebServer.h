#pragma once

#include "Foundation/UniqueFD.h"
#include "Support/BackgroundProcess.h"
#include "Support/Certificates.h"
#include "Support/TempDir.h"

#include <memory>
#include <string>

namespace Support {

/// A port of the loopback device that listens already, and is handed to the server that is to
/// accept on it: nobody can take it in between, and nobody has to wait until the server is there.
class ListeningPort {
 public:
    ListeningPort();

    int getNumber() const { return mNumber; }
    int getFD() const { return mFD.get(); }

 private:
    Foundation::UniqueFD mFD;  ///< inherited by programs that are started
    int mNumber = 0;
};

/// nginx, with a folder of the test's for its files, over HTTP and, with a certificate of each
/// kind, over HTTPS. It knows the user "ann" with the password "secret", and sends `Last-Modified`,
/// `ETag`, ranges and, for XML, gzip.
class NginxServer {
 public:
    /// `locations` is what the configuration has beside that: blocks such as
    /// "location /old { return 301 /new; }". `basicAuthentication()` is one of the lines in them.
    explicit NginxServer(const std::string& locations = "");

    /// The folder whose files are served.
    const TempDir& files() const { return mFiles; }
    std::string url(const std::string& path, const std::string& host = "127.0.0.1") const;
    std::string secureURL(const std::string& path,
                          Certificates::Kind kind = Certificates::Kind::Good,
                          const std::string& host = "localhost") const;
    const Certificates& certificates() const { return mCertificates; }
    /// What it logged of requests, a line each: the request's line, the status, and the user's
    /// name. It is written when the answer is complete.
    std::string accessLog() const { return mDirectory.readFile("access.log"); }

    static std::string basicAuthentication();

 private:
    std::string configuration(const std::string& locations) const;

    TempDir mFiles;
    TempDir mDirectory;
    Certificates mCertificates;
    ListeningPort mPlain;
    ListeningPort mSecure[Certificates::kKinds];
    std::unique_ptr<BackgroundProcess> mProcess;
};

/// lighttpd, which knows what nginx does not: digest authentication. Below /md5/ and /sha256/ it
/// wants that of the user "ann" with the password "secret".
class LighttpdServer {
 public:
    LighttpdServer();

    const TempDir& files() const { return mFiles; }
    std::string url(const std::string& path) const;

 private:
    TempDir mFiles;
    TempDir mDirectory;
    ListeningPort mPort;
    std::unique_ptr<BackgroundProcess> mProcess;
};

}  // namespace Support
