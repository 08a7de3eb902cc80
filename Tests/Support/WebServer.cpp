#include "Support/WebServer.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

#include <stdexcept>

namespace Support {

namespace {

constexpr const char* kPasswords = "ann:{PLAIN}secret\n";

constexpr const char* kNginxHead = R"(
daemon off;
worker_processes 1;
pid DIR/pid;
error_log DIR/error.log;
events { worker_connections 512; }
http {
  log_format short "$request $status $remote_user";
  access_log DIR/access.log short;
  client_body_temp_path DIR/client;
  proxy_temp_path DIR/proxy;
  fastcgi_temp_path DIR/fastcgi;
  uwsgi_temp_path DIR/uwsgi;
  scgi_temp_path DIR/scgi;
  types { text/xml xml; text/html html; application/octet-stream bin; }
  gzip on;
  gzip_types text/xml;
  ssl_certificate_key KEY;
  ssl_session_cache off;
)";

std::string replaced(std::string text, const std::string& what, const std::string& by) {
    for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += by.size()) {
        text.replace(at, what.size(), by);
    }
    return text;
}

std::string portOf(const ListeningPort& port) {
    return "127.0.0.1:" + std::to_string(port.getNumber());
}

/// By bash, for other shells know descriptors of one digit only.
std::unique_ptr<BackgroundProcess> startShell(const std::string& command) {
    return std::make_unique<BackgroundProcess>(
        std::vector<std::string>{"/bin/bash", "-c", command});
}

}  // namespace

ListeningPort::ListeningPort() : mFD(socket(AF_INET, SOCK_STREAM, 0)) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    auto* generic = reinterpret_cast<sockaddr*>(&address);
    if (bind(mFD.get(), generic, size) != 0 || listen(mFD.get(), 512) != 0 ||
        getsockname(mFD.get(), generic, &size) != 0) {
        throw std::runtime_error("cannot listen on the loopback device");
    }
    mNumber = ntohs(address.sin_port);
}

NginxServer::NginxServer(const std::string& locations) {
    mDirectory.writeFile("passwords", kPasswords);
    mDirectory.writeFile("access.log", "");
    mDirectory.writeFile("nginx.conf", configuration(locations));
    std::string sockets;
    for (const ListeningPort* port :
         {&mPlain, &mSecure[0], &mSecure[1], &mSecure[2], &mSecure[3]}) {
        sockets += std::to_string(port->getFD()) + ";";
    }
    // The way in which nginx hands its sockets to a new version of itself.
    mProcess = startShell("NGINX='" + sockets + "' exec nginx -p " + mDirectory.path().string() +
                          " -e " + mDirectory.path().string() + "/error.log -c " +
                          (mDirectory / "nginx.conf") + " 2>/dev/null");
}

std::string NginxServer::configuration(const std::string& locations) const {
    // The files are in folders that only who runs the test can read.
    std::string text = geteuid() == 0 ? "user root;" : "";
    text += replaced(kNginxHead, "DIR", mDirectory.path().string());
    text = replaced(text, "KEY", mCertificates.keyPath());
    const std::string body = "    root " + mFiles.path().string() + ";\n" +
                             replaced(locations, "DIR", mDirectory.path().string()) + "\n  }\n";
    text += "  server {\n    listen " + portOf(mPlain) + ";\n" + body;
    for (int i = 0; i < Certificates::kKinds; ++i) {
        const auto kind = static_cast<Certificates::Kind>(i);
        text += "  server {\n    listen " + portOf(mSecure[i]) + " ssl;\n    ssl_certificate " +
                mCertificates.certificatePath(kind) + ";\n" + body;
    }
    return text + "}\n";
}

std::string NginxServer::basicAuthentication() {
    return "auth_basic \"Tests\"; auth_basic_user_file DIR/passwords;";
}

std::string NginxServer::url(const std::string& path, const std::string& host) const {
    return "http://" + host + ":" + std::to_string(mPlain.getNumber()) + path;
}

std::string NginxServer::secureURL(const std::string& path, Certificates::Kind kind,
                                   const std::string& host) const {
    const ListeningPort& port = mSecure[static_cast<int>(kind)];
    return "https://" + host + ":" + std::to_string(port.getNumber()) + path;
}

LighttpdServer::LighttpdServer() {
    mDirectory.writeFile("passwords", "ann:secret\n");
    std::string text =
        "server.systemd-socket-activation = \"enable\"\n"
        "server.modules = (\"mod_auth\", \"mod_authn_file\")\n"
        "server.document-root = \"" +
        mFiles.path().string() + "\"\nserver.errorlog = \"" + (mDirectory / "error.log") +
        "\"\nserver.port = " + std::to_string(mPort.getNumber()) +
        "\nserver.bind = \"127.0.0.1\"\nmimetype.assign = (\".xml\" => \"text/xml\")\n"
        "auth.backend = \"plain\"\nauth.backend.plain.userfile = \"" +
        (mDirectory / "passwords") + "\"\n";
    for (const char* name : {"MD5", "SHA-256"}) {
        const std::string folder = std::string(name) == "MD5" ? "/md5/" : "/sha256/";
        text += "$HTTP[\"url\"] =~ \"^" + folder + "\" { auth.require = ( \"" + folder +
                "\" => ( \"method\" => \"digest\", \"algorithm\" => \"" + name +
                "\", \"realm\" => \"Tests\", \"require\" => \"valid-user\" ) ) }\n";
    }
    mDirectory.writeFile("lighttpd.conf", text);
    mProcess = startShell("exec 3<&" + std::to_string(mPort.getFD()) +
                          "; export LISTEN_FDS=1 LISTEN_PID=$$; exec lighttpd -D -f " +
                          (mDirectory / "lighttpd.conf"));
}

std::string LighttpdServer::url(const std::string& path) const {
    return "http://127.0.0.1:" + std::to_string(mPort.getNumber()) + path;
}

}  // namespace Support
