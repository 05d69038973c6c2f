#define ZLIB_CONST
#include "compressed_text.h"

#include <zlib.h>

#include <cstdint>
#include <cstdlib>

#include "cfg32_platform.h"

namespace cfg32::platform {

namespace {

// No zlib header or trailer; the sealed form has a check value of its own.
constexpr int raw_deflate = -1;
// A window of 2048 bytes sees the whole of the longest text; more would only be more to wipe.
constexpr int compress_window = 11;
constexpr int compress_memory = 5;
constexpr int expand_window = 15;

// zfree isn't told the size, so it stands in front of the block.
constexpr std::size_t block_header = alignof(std::max_align_t);
static_assert(block_header >= sizeof(std::size_t));

void* allocate_block(void*, uInt count, uInt size) {
    const std::size_t total = block_header + std::size_t{count} * size;
    // Zeroed: zlib's compressor looks at its hash chains before it has filled them.
    auto* block = static_cast<unsigned char*>(std::calloc(1, total));
    if (block == nullptr) {
        return nullptr;
    }
    *reinterpret_cast<std::size_t*>(block) = total;
    return block + block_header;
}

void wipe_and_free_block(void*, void* address) {
    auto* block = static_cast<unsigned char*>(address) - block_header;
    explicit_bzero(block, *reinterpret_cast<std::size_t*>(block));
    std::free(block);
}

// One run over a whole text: in goes all of it, out comes all that fits.
template <int (*Run)(z_stream*, int), int (*End)(z_stream*)>
std::optional<std::size_t> run_whole(z_stream& stream, bytes_view in,
                                     std::span<unsigned char> out) {
    stream.next_in = in.data();
    stream.avail_in = static_cast<uInt>(in.size());
    stream.next_out = out.data();
    stream.avail_out = static_cast<uInt>(out.size());
    const bool complete = Run(&stream, Z_FINISH) == Z_STREAM_END && stream.avail_in == 0;
    const std::size_t left = stream.avail_out;
    End(&stream);
    if (!complete) {
        return std::nullopt;
    }
    return out.size() - left;
}

z_stream wiping_stream() {
    z_stream stream{};
    stream.zalloc = &allocate_block;
    stream.zfree = &wipe_and_free_block;
    return stream;
}

// Where zlib is bound lazily, the first use of each routine that it calls saves the vector
// registers on the stack, and with them pieces of the text. A run over a harmless text when this
// library is loaded gets that over before there are any.
[[maybe_unused]] const bool compressor_is_bound = [] {
    unsigned char harmless[CFG32_PASSWORD_MAX] = {};
    unsigned char out[64];
    const auto size = compress_text(harmless, out);
    return size && expand_text({out, *size}, harmless).has_value();
}();

}  // namespace

std::optional<std::size_t> compress_text(bytes_view text, std::span<unsigned char> out) {
    z_stream stream = wiping_stream();
    if (deflateInit2(&stream, Z_BEST_COMPRESSION, Z_DEFLATED, raw_deflate * compress_window,
                     compress_memory, Z_DEFAULT_STRATEGY) != Z_OK) {
        return std::nullopt;
    }
    return run_whole<&deflate, &deflateEnd>(stream, text, out);
}

std::optional<std::size_t> expand_text(bytes_view compressed, std::span<unsigned char> out) {
    z_stream stream = wiping_stream();
    if (inflateInit2(&stream, raw_deflate * expand_window) != Z_OK) {
        return std::nullopt;
    }
    return run_whole<&inflate, &inflateEnd>(stream, compressed, out);
}

}  // namespace cfg32::platform
