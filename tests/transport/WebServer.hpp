// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <ostream>
#include <string>

#include "CertificateAuthority.hpp"
#include "GitServer.hpp"
#include "ServerProcess.hpp"

namespace vclink::test
{

/// nginx with `git http-backend` behind it: the same repositories at several addresses. All of them
/// take pushes.
class WebServer : public GitServer
{
  public:
    /// The numbers are the places of the ports.
    enum class Site
    {
        Http,
        HttpWithPassword,
        Https,
        HttpsWithPassword,
        HttpsSelfSigned,
        HttpsExpired,
        HttpsWrongHost
    };

    /// @param site the one that base() and url() mean
    explicit WebServer(Site site = Site::Https);

    std::string base() const override;
    std::string base(Site site) const;
    /// The address of a repository at another site.
    std::string urlAt(Site site, const GitRepository &repository) const;

    /// What signed the valid, the expired and the wrong host's certificate.
    std::filesystem::path authority() const
    {
        return authority_.certificate();
    }
    /// The one user of the sites with a password, who is let in.
    static std::string user()
    {
        return "reader";
    }
    static std::string password()
    {
        return "open-sesame";
    }

    void prepareClient() const override;

  private:
    std::string configuration(const std::vector<std::uint16_t> &ports) const;
    std::string siteConfiguration(Site site, std::uint16_t port) const;

    Site site_;
    CertificateAuthority authority_;
    std::unique_ptr<ServerProcess> backend_;
    ListeningServer front_;
};

void PrintTo(WebServer::Site site, std::ostream *stream);

} // namespace vclink::test
