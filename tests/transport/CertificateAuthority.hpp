// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace vclink::test
{

/// Makes certificates of web servers with openssl.
class CertificateAuthority
{
  public:
    enum class Validity
    {
        Now,
        LongAgo
    };

    /// @param folder where all files go; must be there
    explicit CertificateAuthority(std::filesystem::path folder);

    /// What a client has to trust.
    std::filesystem::path certificate() const
    {
        return folder_ / "authority.pem";
    }
    /// "NAME.pem", a certificate signed by the authority, and "NAME.key", its key.
    void issue(const std::string &name, const std::string &host, Validity validity) const;
    /// The same, signed by itself.
    void selfSigned(const std::string &name, const std::string &host) const;

  private:
    std::filesystem::path folder_;
};

} // namespace vclink::test
