// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>

namespace vclink::test
{

/// A certificate, PEM, and the key that belongs to it.
struct Certificate
{
    std::filesystem::path certificate;
    std::filesystem::path key;
};

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
    /// A certificate signed by the authority.
    Certificate issue(const std::string &name, const std::string &host, Validity validity) const;
    /// A certificate signed by itself.
    Certificate selfSigned(const std::string &name, const std::string &host) const;

  private:
    std::filesystem::path folder_;
};

} // namespace vclink::test
