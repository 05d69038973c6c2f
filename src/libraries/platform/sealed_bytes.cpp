#include "sealed_bytes.h"

#include <nettle/gcm.h>
#include <nettle/memops.h>
#include <nettle/nettle-meta.h>
#include <string.h>
#include <sys/random.h>

#include <algorithm>
#include <array>

#include "retry.h"

namespace cfg32::platform {

namespace {

constexpr std::size_t longest_label = 31;

const nettle_aead* cipher_for(std::size_t key_size) {
    switch (key_size) {
        case 16:
            return &nettle_gcm_aes128;
        case 24:
            return &nettle_gcm_aes192;
        case 32:
            return &nettle_gcm_aes256;
        default:
            return nullptr;
    }
}

// A cipher with its key, which is wiped when it goes.
class cipher {
  public:
    explicit cipher(bytes_view key) : type_(cipher_for(key.size())) {
        if (type_ != nullptr) {
            type_->set_encrypt_key(&context_, key.data());
        }
    }
    cipher(const cipher&) = delete;
    cipher& operator=(const cipher&) = delete;
    ~cipher() { explicit_bzero(&context_, sizeof context_); }

    // Takes the nonce, and the label and the flags, which are authenticated only. False for a key
    // or a label that is not to be used.
    bool start(const unsigned char* nonce, std::string_view label, std::uint8_t flags) {
        if (type_ == nullptr || label.size() > longest_label) {
            return false;
        }
        // In one piece: the cipher takes only whole blocks before the last.
        std::array<unsigned char, longest_label + 1> bytes;
        *std::copy(label.begin(), label.end(), bytes.begin()) = flags;
        type_->set_nonce(&context_, nonce);
        type_->update(&context_, label.size() + 1, bytes.data());
        return true;
    }

    void encrypt(bytes_view from, unsigned char* to) {
        type_->encrypt(&context_, from.size(), to, from.data());
    }
    void decrypt(bytes_view from, unsigned char* to) {
        type_->decrypt(&context_, from.size(), to, from.data());
    }
    void tag(unsigned char* to) { type_->digest(&context_, seal_tag_size, to); }

  private:
    const nettle_aead* type_;
    gcm_aes256_ctx context_;  // has room for the others, too
    static_assert(sizeof(gcm_aes256_ctx) >= sizeof(gcm_aes128_ctx) &&
                  sizeof(gcm_aes256_ctx) >= sizeof(gcm_aes192_ctx));
};

bool choose_nonce(unsigned char* nonce) {
    return retry_interrupted([=] { return getrandom(nonce, seal_nonce_size, 0); }) ==
           static_cast<ssize_t>(seal_nonce_size);
}

}  // namespace

bool seal_bytes(const seal_context& context, std::uint8_t flags, bytes_view plain,
                std::span<unsigned char> sealed) {
    if (sealed.size() != plain.size() + seal_overhead) {
        return false;
    }
    unsigned char* const nonce = sealed.data() + 1;
    unsigned char* const text = nonce + seal_nonce_size;

    sealed[0] = flags;
    cipher aes(context.key);
    if (!choose_nonce(nonce) || !aes.start(nonce, context.label, flags)) {
        return false;
    }
    aes.encrypt(plain, text);
    aes.tag(text + plain.size());
    return true;
}

bool unseal_bytes(const seal_context& context, bytes_view sealed, std::uint8_t& flags,
                  std::span<unsigned char> plain) {
    if (sealed.size() != plain.size() + seal_overhead) {
        return false;
    }
    const unsigned char* const nonce = sealed.data() + 1;
    const unsigned char* const text = nonce + seal_nonce_size;

    flags = sealed[0];
    cipher aes(context.key);
    if (!aes.start(nonce, context.label, flags)) {
        return false;
    }
    aes.decrypt({text, plain.size()}, plain.data());
    std::array<unsigned char, seal_tag_size> tag;
    aes.tag(tag.data());
    return memeql_sec(tag.data(), text + plain.size(), tag.size()) != 0;
}

}  // namespace cfg32::platform
