// SPDX-License-Identifier: MIT
#include "WebServer.hpp"

#include <array>
#include <cstdlib>
#include <fstream>
#include <stdexcept>
#include <utility>
#include <vector>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using Site = WebServer::Site;
using Validity = CertificateAuthority::Validity;

constexpr std::array sites{Site::Http,
                           Site::HttpWithPassword,
                           Site::Https,
                           Site::HttpsWithPassword,
                           Site::HttpsSelfSigned,
                           Site::HttpsExpired,
                           Site::HttpsWrongHost};

/// The name of a site's certificate, empty for a site without one.
std::string certificateOf(Site site)
{
    switch (site)
    {
    case Site::Https:
    case Site::HttpsWithPassword:
        return "valid";
    case Site::HttpsSelfSigned:
        return "selfSigned";
    case Site::HttpsExpired:
        return "expired";
    case Site::HttpsWrongHost:
        return "wrongHost";
    case Site::Http:
    case Site::HttpWithPassword:
        break;
    }
    return "";
}

bool wantsPassword(Site site)
{
    return site == Site::HttpWithPassword || site == Site::HttpsWithPassword;
}

bool accepts(const fs::path &socketFile)
{
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    const std::string name = socketFile;
    if (name.size() >= sizeof address.sun_path)
        throw std::runtime_error(name + " is too long for a socket");
    name.copy(address.sun_path, name.size());
    const int probe = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    const bool accepted =
        ::connect(probe, reinterpret_cast<const sockaddr *>(&address), sizeof address) == 0;
    ::close(probe);
    return accepted;
}

fs::path makeFolder(const fs::path &folder)
{
    fs::create_directory(folder);
    return folder;
}

void writeFile(const fs::path &file, const std::string &text)
{
    std::ofstream(file) << text << std::flush;
}

} // namespace

WebServer::WebServer(Site site)
    : site_(site), authority_(makeFolder(folder() / "certificates")),
      backend_(std::make_unique<ServerProcess>(
          std::vector<std::string>{"fcgiwrap", "-f", "-s",
                                   "unix:" + (folder() / "backend").string()},
          makeFolder(folder() / "fcgiwrap")))
{
    if (!backend_->waitUntil([this] { return accepts(folder() / "backend"); }))
        throw std::runtime_error("fcgiwrap does not start:\n" + backend_->log());
    authority_.issue("valid", "localhost", Validity::Now);
    authority_.issue("expired", "localhost", Validity::LongAgo);
    authority_.issue("wrongHost", "elsewhere.example", Validity::Now);
    authority_.selfSigned("selfSigned", "localhost");
    writeFile(folder() / "passwords", user() + ":{PLAIN}" + password() + "\n");
    front_ = startListening(sites.size(), makeFolder(folder() / "nginx"),
                            [this](const std::vector<std::uint16_t> &ports)
                            {
                                const fs::path file = folder() / "nginx.conf";
                                writeFile(file, configuration(ports));
                                return std::vector<std::string>{
                                    "nginx", "-e", "stderr", "-p", folder() / "nginx", "-c", file};
                            });
}

std::string WebServer::configuration(const std::vector<std::uint16_t> &ports) const
{
    std::string text = "daemon off;\n"
                       "master_process off;\n"
                       "pid nginx.pid;\n"
                       "events {}\n"
                       "http {\n"
                       "access_log off;\n"
                       "client_max_body_size 0;\n"
                       "ssl_protocols TLSv1.2;\n";
    for (const char *kind : {"client_body", "proxy", "fastcgi", "uwsgi", "scgi"})
        text += kind + std::string("_temp_path ") + kind + ";\n";
    for (std::size_t i = 0; i < sites.size(); ++i)
        text += siteConfiguration(sites.at(i), ports.at(i));
    return text + "}\n";
}

std::string WebServer::siteConfiguration(Site site, std::uint16_t port) const
{
    const std::string certificate = certificateOf(site);
    std::string text = "server {\nlisten 127.0.0.1:" + std::to_string(port) +
                       (certificate.empty() ? "" : " ssl") + ";\n";
    if (!certificate.empty())
    {
        const std::string file = folder() / "certificates" / certificate;
        text += "ssl_certificate " + file + ".pem;\nssl_certificate_key " + file + ".key;\n";
    }
    text += "location / {\n";
    if (wantsPassword(site))
    {
        text += "auth_basic repositories;\nauth_basic_user_file " +
                (folder() / "passwords").string() + ";\n";
    }
    text += "fastcgi_pass unix:" + (folder() / "backend").string() + ";\n";
    const std::array<std::pair<const char *, std::string>, 11> parameters{
        {{"SCRIPT_FILENAME", GitRepository(folder()).line({"--exec-path"}) + "/git-http-backend"},
         {"GIT_PROJECT_ROOT", repositories()},
         {"GIT_HTTP_EXPORT_ALL", "1"},
         {"HOME", folder()},
         {"PATH_INFO", "$uri"},
         {"QUERY_STRING", "$query_string"},
         {"REQUEST_METHOD", "$request_method"},
         {"CONTENT_TYPE", "$content_type"},
         {"CONTENT_LENGTH", "$content_length"},
         {"REMOTE_ADDR", "$remote_addr"},
         {"REMOTE_USER", "$remote_user"}}};
    for (const auto &[name, value] : parameters)
        text += std::string("fastcgi_param ") + name + " " + value + ";\n";
    return text + "}\n}\n";
}

std::string WebServer::base() const
{
    return base(site_);
}

std::string WebServer::base(Site site) const
{
    // The certificates are for the name, not for the number.
    return (certificateOf(site).empty() ? "http" : "https") + std::string("://localhost:") +
           std::to_string(front_.ports.at(static_cast<std::size_t>(site)));
}

std::string WebServer::urlAt(Site site, const GitRepository &repository) const
{
    return base(site) + "/" + repository.path().filename().string();
}

void WebServer::prepareClient() const
{
    ::setenv("GIT_SSL_CAINFO", authority().c_str(), 1);
}

void PrintTo(Site site, std::ostream *stream)
{
    static const std::array<const char *, sites.size()> names{
        "Http",         "HttpWithPassword", "Https", "HttpsWithPassword", "HttpsSelfSigned",
        "HttpsExpired", "HttpsWrongHost"};
    *stream << names.at(static_cast<std::size_t>(site));
}

} // namespace vclink::test
