#include "Support/Certificates.h"

#include "Support/ChildProcess.h"

#include <stdexcept>

namespace Support {

namespace {

constexpr const char* kNames[Certificates::kKinds] = {"good", "expired", "self", "wrong"};
constexpr const char* kHere = "DNS:localhost,IP:127.0.0.1";
constexpr const char* kFrom = "20200101000000Z";
constexpr const char* kTo = "20991231000000Z";

constexpr const char* kConfiguration = R"(
[ca]
default_ca = own
[own]
new_certs_dir = DIR
database = DIR/index
serial = DIR/serial
default_md = sha256
policy = any
copy_extensions = copy
unique_subject = no
[any]
commonName = supplied
[req]
distinguished_name = name
[name]
)";

std::string replaced(std::string text, const std::string& what, const std::string& by) {
    for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += by.size()) {
        text.replace(at, what.size(), by);
    }
    return text;
}

}  // namespace

Certificates::Certificates() {
    mDirectory.writeFile("config", replaced(kConfiguration, "DIR", mDirectory.path().string()));
    mDirectory.writeFile("index", "");
    mDirectory.writeFile("serial", "01\n");
    openssl("genpkey -algorithm EC -pkeyopt ec_paramgen_curve:P-256 -out DIR/key.pem");
    openssl("genpkey -algorithm EC -pkeyopt ec_paramgen_curve:P-256 -out DIR/authority.key");
    openssl(
        "req -x509 -config DIR/config -key DIR/authority.key -subj /CN=Tests -days 3650 "
        "-addext basicConstraints=critical,CA:true -out DIR/authority.pem");
    openssl(std::string("req -x509 -config DIR/config -key DIR/key.pem -subj /CN=localhost "
                        "-days 3650 -addext subjectAltName=") +
            kHere + " -out " + certificatePath(Kind::SelfSigned));
    sign(Kind::Good, kHere, kFrom, kTo);
    sign(Kind::Expired, kHere, kFrom, "20200102000000Z");
    sign(Kind::WrongName, "DNS:elsewhere.example", kFrom, kTo);
}

std::string Certificates::certificatePath(Kind kind) const {
    return mDirectory / (std::string(kNames[static_cast<int>(kind)]) + ".pem");
}

void Certificates::sign(Kind kind, const std::string& names, const std::string& from,
                        const std::string& to) {
    openssl(
        "req -new -config DIR/config -key DIR/key.pem -subj /CN=server -addext "
        "subjectAltName=" +
        names + " -out DIR/request");
    openssl(
        "ca -batch -notext -config DIR/config -cert DIR/authority.pem "
        "-keyfile DIR/authority.key -in DIR/request -startdate " +
        from + " -enddate " + to + " -out " + certificatePath(kind));
}

void Certificates::openssl(const std::string& arguments) const {
    const std::string command =
        "exec openssl " + replaced(arguments, "DIR", mDirectory.path().string());
    const ChildResult result = runChild({"/bin/sh", "-c", command});
    if (result.status != 0) throw std::runtime_error(command + ": " + result.err);
}

}  // namespace Support
