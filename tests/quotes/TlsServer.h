#pragma once

#include <openssl/pem.h>
#include <openssl/ssl.h>
#include <openssl/x509v3.h>

#include "LoopbackServer.h"

// A new key and a certificate of 127.0.0.1 that vouches for itself.
class TlsIdentity {
  public:
    TlsIdentity() {
        const std::unique_ptr<EVP_PKEY, decltype(&EVP_PKEY_free)> key(EVP_EC_gen("P-256"), EVP_PKEY_free);
        const std::unique_ptr<X509, decltype(&X509_free)> certificate(X509_new(), X509_free);
        X509_set_version(certificate.get(), 2);
        X509_gmtime_adj(X509_getm_notBefore(certificate.get()), -3600);
        X509_gmtime_adj(X509_getm_notAfter(certificate.get()), 3600);
        const unsigned char text[] = "test";
        X509_NAME* name = X509_get_subject_name(certificate.get());
        X509_NAME_add_entry_by_NID(name, NID_commonName, MBSTRING_ASC, text, 4, -1, 0);
        X509_set_issuer_name(certificate.get(), name);
        X509_set_pubkey(certificate.get(), key.get());
        const std::unique_ptr<X509_EXTENSION, decltype(&X509_EXTENSION_free)> alternatives(
            X509V3_EXT_conf_nid(nullptr, nullptr, NID_subject_alt_name, "IP:127.0.0.1"), X509_EXTENSION_free);
        X509_add_ext(certificate.get(), alternatives.get(), -1);
        X509_sign(certificate.get(), key.get(), EVP_sha256());
        SSL_CTX_use_certificate(context_.get(), certificate.get());
        SSL_CTX_use_PrivateKey(context_.get(), key.get());
    }

    [[nodiscard]] std::shared_ptr<SSL_CTX> Context() const { return context_; }
    void AddCertificateTo(const std::string& path) const {
        std::FILE* file = std::fopen(path.c_str(), "a");
        PEM_write_X509(file, SSL_CTX_get0_certificate(context_.get()));
        std::fclose(file);
    }

  private:
    std::shared_ptr<SSL_CTX> context_{SSL_CTX_new(TLS_server_method()), SSL_CTX_free};
};

struct TlsStream : ServerStream {
    TlsStream(int socket, SSL_CTX* context) : ServerStream(socket), ssl(SSL_new(context), SSL_free) {
        SSL_set_fd(ssl.get(), fd);
        SSL_set_accept_state(ssl.get());
    }
    long Read(char* bytes, std::size_t size) override {
        return SSL_read(ssl.get(), bytes, static_cast<int>(size));
    }
    long Write(const std::string& bytes) override {
        return SSL_write(ssl.get(), bytes.data(), static_cast<int>(bytes.size()));
    }
    void Finish() override { SSL_shutdown(ssl.get()); }

    const std::unique_ptr<SSL, decltype(&SSL_free)> ssl;
};

class TlsServer : public LoopbackServer {
  public:
    TlsServer(const TlsIdentity& identity, Answer answer)
        : LoopbackServer(std::move(answer), [context = identity.Context()](int fd) {
              return std::make_unique<TlsStream>(fd, context.get());
          }) {}

    [[nodiscard]] std::string Host() const { return "https://" + LoopbackServer::Host(); }
};
