#include "Support/WebServer.h"

#include "Support/ChildProcess.h"

#include <gtest/gtest.h>

using namespace Support;

namespace {

/// The status and the body that curl gets, or its own number for what went wrong.
std::string curl(const std::vector<std::string>& arguments) {
    std::vector<std::string> command{"/usr/bin/curl", "-s", "-m", "60",
                                     "--noproxy",     "*",  "-w", " %{http_code}"};
    command.insert(command.end(), arguments.begin(), arguments.end());
    const ChildResult result = runChild(command);
    return result.status == 0 ? result.out : "failed " + std::to_string(result.status);
}

}  // namespace

TEST(NginxServer, ServesFilesRedirectsAndPasswords) {
    const NginxServer server("location /old { return 301 /a.xml; }\nlocation /private/ { " +
                             NginxServer::basicAuthentication() + " }");
    server.files().writeFile("a.xml", "<a/>");
    server.files().makeDirectory("private");
    server.files().writeFile("private/a.xml", "<p/>");
    EXPECT_EQ(curl({server.url("/a.xml")}), "<a/> 200");
    EXPECT_EQ(curl({"-L", server.url("/old")}), "<a/> 200");
    const std::string tag = server.files() / "tag";
    EXPECT_EQ(curl({"--etag-save", tag, server.url("/a.xml")}), "<a/> 200");
    EXPECT_EQ(curl({"--etag-compare", tag, server.url("/a.xml")}), " 304");
    EXPECT_NE(curl({server.url("/private/a.xml")}).find(" 401"), std::string::npos);
    EXPECT_EQ(curl({"-u", "ann:secret", server.url("/private/a.xml")}), "<p/> 200");
    EXPECT_NE(server.accessLog().find("GET /private/a.xml HTTP/1.1 200 ann\n"), std::string::npos);
}

TEST(NginxServer, HasACertificateOfEachKind) {
    using Kind = Certificates::Kind;
    const NginxServer server;
    server.files().writeFile("a.xml", "<a/>");
    const std::string authority = server.certificates().authorityPath();
    const auto ask = [&](Kind kind) {
        return curl({"--cacert", authority, server.secureURL("/a.xml", kind)});
    };
    EXPECT_EQ(ask(Kind::Good), "<a/> 200");
    for (const Kind kind : {Kind::Expired, Kind::SelfSigned, Kind::WrongName}) {
        EXPECT_EQ(ask(kind), "failed 60");
        EXPECT_EQ(curl({"-k", server.secureURL("/a.xml", kind)}), "<a/> 200");
    }
    EXPECT_EQ(curl({server.secureURL("/a.xml")}), "failed 60");
}

TEST(LighttpdServer, WantsDigestsOfPasswords) {
    const LighttpdServer server;
    for (const char* folder : {"md5", "sha256"}) {
        server.files().makeDirectory(folder);
        const std::string file = std::string(folder) + "/a.xml";
        server.files().writeFile(file, "<a/>");
        const std::string url = server.url("/" + file);
        EXPECT_NE(curl({url}).find(" 401"), std::string::npos);
        EXPECT_EQ(curl({"--digest", "-u", "ann:secret", url}), "<a/> 200");
        EXPECT_NE(curl({"--digest", "-u", "ann:wrong", url}).find(" 401"), std::string::npos);
        EXPECT_NE(curl({"--basic", "-u", "ann:secret", url}).find(" 401"), std::string::npos);
    }
}
