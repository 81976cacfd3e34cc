#pragma once

#include <memory>
#include <openssl/pem.h>
#include <openssl/ssl.h>
#include <openssl/x509v3.h>
#include <string>

#include "LoopbackServer.h"

// A key and a certificate for it, made anew, that vouches for itself: a client that trusts it trusts the
// server that shows it.
class TlsIdentity {
  public:
    // `names` as in "IP:127.0.0.1,DNS:localhost".
    explicit TlsIdentity(const std::string& names) {
        X509_set_version(certificate_.get(), 2);
        ASN1_INTEGER_set(X509_get_serialNumber(certificate_.get()), 1);
        X509_gmtime_adj(X509_getm_notBefore(certificate_.get()), -3600);
        X509_gmtime_adj(X509_getm_notAfter(certificate_.get()), 3600);
        X509_NAME* name = X509_get_subject_name(certificate_.get());
        X509_NAME_add_entry_by_txt(name, "CN", MBSTRING_ASC,
                                   reinterpret_cast<const unsigned char*>("loopback"), -1, -1, 0);
        X509_set_issuer_name(certificate_.get(), name);
        X509_set_pubkey(certificate_.get(), key_.get());
        Extend(NID_basic_constraints, "critical,CA:TRUE");
        Extend(NID_subject_alt_name, names);
        X509_sign(certificate_.get(), key_.get(), EVP_sha256());
    }

    [[nodiscard]] EVP_PKEY* Key() const { return key_.get(); }
    [[nodiscard]] X509* Certificate() const { return certificate_.get(); }
    void WriteCertificate(const std::string& path) const {
        std::FILE* file = std::fopen(path.c_str(), "w");
        PEM_write_X509(file, certificate_.get());
        std::fclose(file);
    }

  private:
    void Extend(int kind, const std::string& value) {
        X509_EXTENSION* extension = X509V3_EXT_conf_nid(nullptr, nullptr, kind, value.c_str());
        X509_add_ext(certificate_.get(), extension, -1);
        X509_EXTENSION_free(extension);
    }

    std::unique_ptr<EVP_PKEY, decltype(&EVP_PKEY_free)> key_{EVP_EC_gen("P-256"), EVP_PKEY_free};
    std::unique_ptr<X509, decltype(&X509_free)> certificate_{X509_new(), X509_free};
};

class TlsStream : public ServerStream {
  public:
    TlsStream(int fd, SSL_CTX* context) : ServerStream(fd), ssl_(SSL_new(context), SSL_free) {
        SSL_set_fd(ssl_.get(), fd);
        SSL_set_accept_state(ssl_.get());
    }
    ssize_t Read(char* bytes, std::size_t size) override {
        return Result(SSL_read(ssl_.get(), bytes, static_cast<int>(size)));
    }
    ssize_t Write(const char* bytes, std::size_t size) override {
        return Result(SSL_write(ssl_.get(), bytes, static_cast<int>(std::min(size, std::size_t{16'000}))));
    }
    void Finish() override { SSL_shutdown(ssl_.get()); }

  private:
    ssize_t Result(int result) {
        const int error = SSL_get_error(ssl_.get(), result);
        errno = error == SSL_ERROR_WANT_READ || error == SSL_ERROR_WANT_WRITE ? EAGAIN : EPROTO;
        return result > 0 ? result : -1;
    }

    std::unique_ptr<SSL, decltype(&SSL_free)> ssl_;
};

// A loopback server behind TLS.
class TlsServer {
  public:
    TlsServer(const TlsIdentity& identity, LoopbackServer::Answer answer)
        : context_(MakeContext(identity)), server_(std::move(answer), 0, [this](int fd) {
              return std::make_unique<TlsStream>(fd, context_.get());
          }) {}

    [[nodiscard]] LoopbackServer& Server() { return server_; }
    // As a quote source's host field.
    [[nodiscard]] std::string Host() const { return "https://" + server_.Host(); }

  private:
    using Context = std::unique_ptr<SSL_CTX, decltype(&SSL_CTX_free)>;
    static Context MakeContext(const TlsIdentity& identity) {
        Context context(SSL_CTX_new(TLS_server_method()), SSL_CTX_free);
        SSL_CTX_use_certificate(context.get(), identity.Certificate());
        SSL_CTX_use_PrivateKey(context.get(), identity.Key());
        SSL_CTX_set_mode(context.get(), SSL_MODE_ENABLE_PARTIAL_WRITE | SSL_MODE_ACCEPT_MOVING_WRITE_BUFFER);
        return context;
    }

    Context context_;
    LoopbackServer server_;
};
