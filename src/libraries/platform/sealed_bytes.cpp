#include "sealed_bytes.h"

#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/rand.h>

#include <memory>

namespace cfg32::platform {

namespace {

struct cipher_context_free {
    void operator()(EVP_CIPHER_CTX* context) const { EVP_CIPHER_CTX_free(context); }
};
// Freeing the context wipes the expanded key in it.
using cipher_context = std::unique_ptr<EVP_CIPHER_CTX, cipher_context_free>;

// What OpenSSL has to say about a failure here is nobody else's: the thread's error queue is left
// as it was found (ERR_set_mark(3)).
class error_queue_guard {
  public:
    error_queue_guard() { ERR_set_mark(); }
    error_queue_guard(const error_queue_guard&) = delete;
    error_queue_guard& operator=(const error_queue_guard&) = delete;
    ~error_queue_guard() { ERR_pop_to_mark(); }
};

enum direction { decrypt = 0, encrypt = 1 };

const EVP_CIPHER* cipher_for(std::size_t key_size) {
    switch (key_size) {
        case 16:
            return EVP_aes_128_gcm();
        case 24:
            return EVP_aes_192_gcm();
        case 32:
            return EVP_aes_256_gcm();
        default:
            return nullptr;
    }
}

// Feeds bytes to the cipher; without an output they are authenticated only.
bool update(EVP_CIPHER_CTX* cipher, unsigned char* out, const void* in, std::size_t size) {
    int written = 0;
    return EVP_CipherUpdate(cipher, out, &written, static_cast<const unsigned char*>(in),
                            static_cast<int>(size)) == 1;
}

// A cipher that has taken the key, the nonce, the label and the flags; null on failure.
cipher_context start(const seal_context& context, const unsigned char* nonce, std::uint8_t flags,
                     direction way) {
    const EVP_CIPHER* type = cipher_for(context.key.size());
    cipher_context cipher(type == nullptr ? nullptr : EVP_CIPHER_CTX_new());
    // The cipher's own nonce size is the 12 bytes used here.
    if (!cipher ||
        EVP_CipherInit_ex(cipher.get(), type, nullptr, context.key.data(), nonce, way) != 1 ||
        !update(cipher.get(), nullptr, context.label.data(), context.label.size()) ||
        !update(cipher.get(), nullptr, &flags, sizeof flags)) {
        return nullptr;
    }
    return cipher;
}

}  // namespace

bool seal_bytes(const seal_context& context, std::uint8_t flags, bytes_view plain,
                std::span<unsigned char> sealed) {
    const error_queue_guard errors;
    if (sealed.size() != plain.size() + seal_overhead) {
        return false;
    }
    unsigned char* const nonce = sealed.data() + 1;
    unsigned char* const text = nonce + seal_nonce_size;
    unsigned char* const tag = text + plain.size();

    sealed[0] = flags;
    if (RAND_bytes(nonce, seal_nonce_size) != 1) {
        return false;
    }
    const cipher_context cipher = start(context, nonce, flags, encrypt);
    int rest = 0;
    return cipher && (plain.empty() || update(cipher.get(), text, plain.data(), plain.size())) &&
           EVP_CipherFinal_ex(cipher.get(), tag, &rest) == 1 &&
           EVP_CIPHER_CTX_ctrl(cipher.get(), EVP_CTRL_GCM_GET_TAG, seal_tag_size, tag) == 1;
}

bool unseal_bytes(const seal_context& context, bytes_view sealed, std::uint8_t& flags,
                  std::span<unsigned char> plain) {
    const error_queue_guard errors;
    if (sealed.size() != plain.size() + seal_overhead) {
        return false;
    }
    const unsigned char* const nonce = sealed.data() + 1;
    const unsigned char* const text = nonce + seal_nonce_size;
    // OpenSSL takes the tag through a pointer to mutable bytes and doesn't change them.
    auto* const tag = const_cast<unsigned char*>(text + plain.size());

    flags = sealed[0];
    const cipher_context cipher = start(context, nonce, flags, decrypt);
    unsigned char end[EVP_MAX_BLOCK_LENGTH];
    int rest = 0;
    return cipher && (plain.empty() || update(cipher.get(), plain.data(), text, plain.size())) &&
           EVP_CIPHER_CTX_ctrl(cipher.get(), EVP_CTRL_GCM_SET_TAG, seal_tag_size, tag) == 1 &&
           EVP_CipherFinal_ex(cipher.get(), end, &rest) == 1;
}

}  // namespace cfg32::platform
