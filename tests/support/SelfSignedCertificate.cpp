#include "tests/support/SelfSignedCertificate.h"

#include <cstdio>
#include <memory>
#include <openssl/evp.h>
#include <openssl/pem.h>
#include <openssl/rsa.h>
#include <openssl/x509v3.h>
#include <stdexcept>

namespace QVSa::test {

namespace {

void extend(X509* certificate, int kind, const char* value) {
  const std::unique_ptr<X509_EXTENSION, decltype(&X509_EXTENSION_free)> extension(
      X509V3_EXT_conf_nid(nullptr, nullptr, kind, value), X509_EXTENSION_free);
  X509_add_ext(certificate, extension.get(), -1);
}

template <class Write>
void toFile(const std::filesystem::path& path, Write write) {
  FILE* file = std::fopen(path.c_str(), "w");
  const bool written = file != nullptr && write(file) == 1;
  if (file != nullptr) std::fclose(file);
  if (!written) throw std::runtime_error("cannot write " + path.string());
}

}  // namespace

void writeSelfSignedCertificate(const std::filesystem::path& certificate, const std::filesystem::path& key) {
  const std::unique_ptr<EVP_PKEY, decltype(&EVP_PKEY_free)> pair(EVP_RSA_gen(2048), EVP_PKEY_free);
  const std::unique_ptr<X509, decltype(&X509_free)> x509(X509_new(), X509_free);
  X509_set_version(x509.get(), X509_VERSION_3);
  ASN1_INTEGER_set(X509_get_serialNumber(x509.get()), 1);
  X509_gmtime_adj(X509_getm_notBefore(x509.get()), -3600);
  X509_gmtime_adj(X509_getm_notAfter(x509.get()), 86400);
  X509_set_pubkey(x509.get(), pair.get());
  X509_NAME* name = X509_get_subject_name(x509.get());
  X509_NAME_add_entry_by_txt(name, "CN", MBSTRING_ASC, reinterpret_cast<const unsigned char*>("127.0.0.1"), -1, -1, 0);
  X509_set_issuer_name(x509.get(), name);
  extend(x509.get(), NID_basic_constraints, "critical,CA:TRUE");
  extend(x509.get(), NID_subject_alt_name, "IP:127.0.0.1");
  X509_sign(x509.get(), pair.get(), EVP_sha256());
  toFile(certificate, [&](FILE* file) { return PEM_write_X509(file, x509.get()); });
  toFile(key,
         [&](FILE* file) { return PEM_write_PrivateKey(file, pair.get(), nullptr, nullptr, 0, nullptr, nullptr); });
}

}  // namespace QVSa::test
