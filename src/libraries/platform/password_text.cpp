#include "password_text.h"

#include <algorithm>
#include <cstdint>

#include "base64.h"
#include "compressed_text.h"
#include "key_data.h"
#include "password_scheme.h"
#include "sealed_bytes.h"

namespace cfg32::platform {

namespace {

constexpr std::uint8_t format_version = 0x10;
constexpr std::uint8_t compressed_flag = 0x01;

// What begins a masked text, with or without its tag before it.
constexpr char mask_mark = '>';

// Known to everybody who reads this: masking hides nothing from them.
constexpr std::size_t masking_key_size = 32;
constexpr unsigned char masking_key[masking_key_size + 1] = "this one masks, it hides nothing";
constexpr seal_context masking = {{masking_key, masking_key_size}, "{iMASK}>"};

constexpr std::size_t largest_payload = CFG32_PASSWORD_MAX + seal_overhead;

bool has_nul(bytes_view bytes) { return std::find(bytes.begin(), bytes.end(), 0) != bytes.end(); }

// Label and base64 into a buffer that is known to be large enough.
bool seal_as_text(const seal_context& context, std::uint8_t flags, bytes_view plain, char* out) {
    unsigned char payload[largest_payload];
    const std::span<unsigned char> sealed(payload, plain.size() + seal_overhead);
    if (!seal_bytes(context, flags, plain, sealed)) {
        return false;
    }
    out = std::copy(context.label.begin(), context.label.end(), out);
    *base64_encode(sealed, out) = '\0';
    return true;
}

bool encode(const seal_context& context, bytes_view clear, std::span<char> out) {
    const std::size_t fixed = context.label.size() + 1;
    const std::size_t payload_room = base64_room(out.size() - std::min(out.size(), fixed));
    if (payload_room < seal_overhead) {
        return false;
    }
    const std::size_t room = payload_room - seal_overhead;
    if (clear.size() <= room) {
        return seal_as_text(context, format_version, clear, out.data());
    }

    clear_text shorter;
    const auto size = compress_text(clear, {shorter.data(), shorter.capacity()});
    if (!size || *size > room) {
        return false;
    }
    shorter.resize(*size);
    return seal_as_text(context, format_version | compressed_flag, shorter.view(), out.data());
}

bool copy_text(bytes_view from, clear_text& to) {
    std::copy(from.begin(), from.end(), to.data());
    to.resize(from.size());
    return true;
}

bool expand(bytes_view compressed, clear_text& clear) {
    const auto size = expand_text(compressed, {clear.data(), clear.capacity()});
    clear.resize(size.value_or(0));
    return size.has_value();
}

bool decode(const seal_context& context, std::string_view armored, clear_text& clear) {
    unsigned char payload[largest_payload];
    const auto size = base64_decode(armored, payload);
    if (!size || *size < seal_overhead) {
        return false;
    }
    clear_text plain;
    plain.resize(*size - seal_overhead);
    std::uint8_t flags = 0;
    if (!unseal_bytes(context, {payload, *size}, flags, {plain.data(), plain.size()})) {
        return false;
    }
    if ((flags & ~compressed_flag) != format_version) {
        return false;
    }
    const bool done = (flags & compressed_flag) != 0 ? expand(plain.view(), clear)
                                                     : copy_text(plain.view(), clear);
    return done && !has_nul(clear.view());
}

// A masked text from its mark on.
bool unmask(std::string_view marked, clear_text& clear) {
    return !marked.empty() && marked.front() == mask_mark &&
           decode(masking, marked.substr(1), clear);
}

seal_context encryption(const password_scheme& scheme, const aes_key_data& key) {
    return {key.view(), scheme.tag};
}

}  // namespace

bool encode_password(bytes_view clear, const aes_key_data* key, std::span<char> out) {
    if (clear.size() > CFG32_PASSWORD_MAX || has_nul(clear)) {
        return false;
    }
    if (key == nullptr) {
        return encode(masking, clear, out);
    }
    const password_scheme* scheme = scheme_for_key(key->size);
    return scheme != nullptr && encode(encryption(*scheme, *key), clear, out);
}

bool decode_password(std::string_view encoded, const aes_key_data* key, clear_text& clear) {
    const password_scheme* scheme = scheme_of(encoded);
    if (scheme == nullptr) {
        return unmask(encoded, clear);
    }
    const std::string_view rest = encoded.substr(scheme->tag.size());
    switch (scheme->kind) {
        case scheme_kind::masked:
            return unmask(rest, clear);
        case scheme_kind::encrypted:
            return key != nullptr && key->size == scheme->key_size &&
                   decode(encryption(*scheme, *key), rest, clear);
        case scheme_kind::hashed:
            break;
    }
    return false;
}

bool is_encoded_password(std::string_view text) {
    clear_text clear;
    return scheme_of(text) != nullptr || unmask(text, clear);
}

}  // namespace cfg32::platform
