// SPDX-License-Identifier: MIT
#include "CertificateAuthority.hpp"

#include <fstream>
#include <utility>
#include <vector>

#include "support/Command.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// What `openssl ca` wants to have; it is the one command that sets the day on which a certificate
/// ends in the past.
const char *const configuration = "[ca]\n"
                                  "default_ca = authority\n"
                                  "[authority]\n"
                                  "database = index.txt\n"
                                  "new_certs_dir = .\n"
                                  "rand_serial = yes\n"
                                  "certificate = authority.pem\n"
                                  "private_key = authority.key\n"
                                  "default_md = sha256\n"
                                  "policy = any\n"
                                  "copy_extensions = copy\n"
                                  "unique_subject = no\n"
                                  "[any]\n"
                                  "commonName = supplied\n"
                                  "[req]\n"
                                  "distinguished_name = name\n"
                                  "[name]\n";

void openssl(const fs::path &folder, std::vector<std::string> arguments)
{
    arguments.insert(arguments.begin(), "openssl");
    Command(std::move(arguments)).in(folder).runOrThrow();
}

/// A request or, with "-x509", a certificate that signs itself, and its key.
void makeRequest(const fs::path &folder, const std::string &name, const std::string &file,
                 const std::string &host, const std::vector<std::string> &more)
{
    std::vector<std::string> arguments{
        "req",         "-new",  "-config",     "ca.conf",
        "-newkey",     "ec",    "-pkeyopt",    "ec_paramgen_curve:prime256v1",
        "-nodes",      "-subj", "/CN=" + host, "-keyout",
        name + ".key", "-out",  file};
    arguments.insert(arguments.end(), more.begin(), more.end());
    openssl(folder, std::move(arguments));
}

} // namespace

CertificateAuthority::CertificateAuthority(fs::path folder) : folder_(std::move(folder))
{
    std::ofstream(folder_ / "ca.conf") << configuration << std::flush;
    std::ofstream(folder_ / "index.txt") << std::flush;
    makeRequest(folder_, "authority", "authority.pem", "Test Authority",
                {"-x509", "-days", "7", "-addext", "basicConstraints=critical,CA:TRUE", "-addext",
                 "keyUsage=critical,keyCertSign"});
}

void CertificateAuthority::issue(const std::string &name, const std::string &host,
                                 Validity validity) const
{
    makeRequest(folder_, name, name + ".csr", host, {"-addext", "subjectAltName=DNS:" + host});
    std::vector<std::string> arguments{"ca",  "-batch",      "-notext", "-config",    "ca.conf",
                                       "-in", name + ".csr", "-out",    name + ".pem"};
    if (validity == Validity::Now)
        arguments.insert(arguments.end(), {"-days", "7"});
    else
        arguments.insert(arguments.end(),
                         {"-startdate", "20010101000000Z", "-enddate", "20020101000000Z"});
    openssl(folder_, std::move(arguments));
}

void CertificateAuthority::selfSigned(const std::string &name, const std::string &host) const
{
    makeRequest(folder_, name, name + ".pem", host,
                {"-x509", "-days", "7", "-addext", "subjectAltName=DNS:" + host});
}

} // namespace vclink::test
