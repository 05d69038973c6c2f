#include "sealed_bytes.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <string>
#include <vector>

#include "call_faults.h"

namespace cfg32::platform {
namespace {

using bytes = std::vector<unsigned char>;

const bytes key(32, 0x5a);
const bytes plain = {'s', 'e', 'c', 'r', 'e', 't'};
const seal_context context = {key, "{AES256}"};

bytes sealed_form(const seal_context& with = context, std::uint8_t flags = 0x10) {
    bytes sealed(plain.size() + seal_overhead);
    EXPECT_TRUE(seal_bytes(with, flags, plain, sealed));
    return sealed;
}

bool opens(const seal_context& with, const bytes& sealed) {
    bytes out(sealed.size() - seal_overhead);
    std::uint8_t flags = 0;
    return unseal_bytes(with, sealed, flags, out);
}

TEST(SealedBytes, ComeBackWithTheirFlagsUnderEveryKeySize) {
    for (const std::size_t size : {16u, 24u, 32u}) {
        const bytes some_key(size, 0x33);
        const seal_context with = {some_key, "label"};
        const bytes sealed = sealed_form(with, 0x42);
        bytes out(plain.size());
        std::uint8_t flags = 0;
        ASSERT_TRUE(unseal_bytes(with, sealed, flags, out)) << size;
        EXPECT_EQ(out, plain);
        EXPECT_EQ(flags, 0x42);
    }
}

TEST(SealedBytes, DoNotOpenUnderAKeyOfNoCipher) {
    const bytes sealed = sealed_form();
    for (const std::size_t size : {0u, 8u, 31u, 33u}) {
        const bytes some_key(size, 0x5a);
        EXPECT_FALSE(opens({some_key, context.label}, sealed)) << size;
    }
}

TEST(SealedBytes, AreSealedAfreshEachTime) {
    const bytes first = sealed_form();
    const bytes second = sealed_form();
    EXPECT_NE(bytes(first.begin() + 1, first.begin() + 13),
              bytes(second.begin() + 1, second.begin() + 13));
    EXPECT_NE(bytes(first.begin() + 13, first.end()), bytes(second.begin() + 13, second.end()));
}

TEST(SealedBytes, DoNotShowTheText) {
    const bytes sealed = sealed_form();
    EXPECT_EQ(std::search(sealed.begin(), sealed.end(), plain.begin(), plain.end()), sealed.end());
}

TEST(SealedBytes, OpenWithNoBitChanged) {
    const bytes sealed = sealed_form();
    ASSERT_TRUE(opens(context, sealed));
    for (std::size_t at = 0; at < sealed.size(); ++at) {
        for (unsigned bit = 1; bit < 256; bit <<= 1) {
            bytes damaged = sealed;
            damaged[at] = static_cast<unsigned char>(damaged[at] ^ bit);
            EXPECT_FALSE(opens(context, damaged)) << at << " " << bit;
        }
    }
}

TEST(SealedBytes, OpenUnderTheSameKeyAndLabelOnly) {
    const bytes sealed = sealed_form();
    bytes other_key = key;
    other_key[31] ^= 1;
    const bytes shorter_key(16, 0x5a);
    EXPECT_FALSE(opens({other_key, context.label}, sealed));
    EXPECT_FALSE(opens({shorter_key, context.label}, sealed));
    EXPECT_FALSE(opens({key, "{AES25}"}, sealed));
    EXPECT_FALSE(opens({key, ""}, sealed));
}

TEST(SealedBytes, RefuseOtherKeySizesAndWrongRoom) {
    const bytes odd_key(20, 1);
    bytes sealed(plain.size() + seal_overhead);
    EXPECT_FALSE(seal_bytes({odd_key, "x"}, 0, plain, sealed));
    EXPECT_FALSE(seal_bytes(context, 0, plain, {sealed.data(), sealed.size() - 1}));
    std::uint8_t flags = 0;
    bytes out(plain.size() + 1);
    EXPECT_FALSE(unseal_bytes(context, sealed_form(), flags, out));
}

TEST(SealedBytes, MayBeNone) {
    bytes sealed(seal_overhead);
    ASSERT_TRUE(seal_bytes(context, 0x10, {}, sealed));
    EXPECT_TRUE(opens(context, sealed));
    sealed.back() ^= 1;
    EXPECT_FALSE(opens(context, sealed));
}

TEST(SealedBytes, AreNotMadeWithoutRandomData) {
    bytes sealed(plain.size() + seal_overhead);
    const call_fault fault(watched_call::random, 1, ENOSYS);
    EXPECT_FALSE(seal_bytes(context, 0x10, plain, sealed));
}

}  // namespace
}  // namespace cfg32::platform
