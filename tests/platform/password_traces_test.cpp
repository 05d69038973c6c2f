// After an encoding or decoding call returns, neither its stack nor a block that it freed may hold
// any of the clear text or the key. The calls run on a stack of this file's own, which is searched
// afterwards.
#include <gtest/gtest.h>
#include <pthread.h>
#include <sys/mman.h>

#include <functional>
#include <string>
#include <utility>

#include "call_faults.h"
#include "password_support.h"

namespace {

constexpr std::size_t stack_size = std::size_t{1} << 20;

// Long enough to be found in pieces, without a repetition that would betray where it came from.
const std::string secret = "correct horse battery staple, 0123456789-abcdefghijklmnopqrstuv";
constexpr std::size_t piece = 12;

// The thread sanitizer keeps copies of its own on the stack.
#if defined(__SANITIZE_THREAD__)
constexpr bool stack_is_ours = false;
#elif defined(__has_feature)
constexpr bool stack_is_ours = !__has_feature(thread_sanitizer);
#else
constexpr bool stack_is_ours = true;
#endif

class searched_stack {
  public:
    searched_stack()
        : memory_(::mmap(nullptr, stack_size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS,
                         -1, 0)) {}
    searched_stack(const searched_stack&) = delete;
    searched_stack& operator=(const searched_stack&) = delete;
    ~searched_stack() { ::munmap(memory_, stack_size); }

    void run(std::function<void()> body) {
        pthread_attr_t attributes;
        pthread_attr_init(&attributes);
        ASSERT_EQ(pthread_attr_setstack(&attributes, memory_, stack_size), 0);
        pthread_t thread;
        ASSERT_EQ(pthread_create(&thread, &attributes, &start, &body), 0);
        pthread_attr_destroy(&attributes);
        pthread_join(thread, nullptr);
    }

    // The number of places where a piece of the text stands.
    int traces_of(std::string_view text) const {
        const std::string_view stack(static_cast<const char*>(memory_), stack_size);
        int found = 0;
        if (!stack_is_ours)
            return found;
        for (std::size_t at = 0; at + piece <= text.size(); ++at)
            found += stack.find(text.substr(at, piece)) != std::string_view::npos ? 1 : 0;
        return found;
    }

  private:
    static void* start(void* body) {
        (*static_cast<std::function<void()>*>(body))();
        return nullptr;
    }

    void* memory_;
};

class PasswordTraces : public testing::TestWithParam<std::size_t> {
  protected:
    key_pointer key_ = make_key(GetParam(), 'A');
    const std::string key_bytes_ =
        std::string("ABCDEFGHIJKLMNOPQRSTUVWXYZ[\\]^_`").substr(0, GetParam());
    searched_stack stack_;
};
INSTANTIATE_TEST_SUITE_P(Password, PasswordTraces, testing::Values(0, 16, 24, 32));

TEST(SearchedStack, FindsATextThatWasLeftThere) {
    searched_stack stack;
    stack.run([] {
        volatile char left[200];
        for (std::size_t i = 0; i < secret.size(); ++i)
            left[i] = secret[i];
        EXPECT_EQ(left[0], secret[0]);
    });
    EXPECT_EQ(stack.traces_of(secret) > 0, stack_is_ours);
}

TEST_P(PasswordTraces, EncodingLeavesNone) {
    // Long enough to be compressed, so that the compressor sees it as well.
    std::string clear;
    while (clear.size() + secret.size() <= CFG32_PASSWORD_MAX)
        clear += secret;
    for (const std::string& text : {secret, clear}) {
        std::string out(usual_room, '\0');
        int result = 0;
        int leaks = 0;
        stack_.run([&] {
            const free_watch watch(std::string_view(secret).substr(0, piece));
            result = format_password(133, 0, key_.get(), text.data(), static_cast<int>(text.size()),
                                     out.data(), usual_room);
            leaks = watch.leaks();
        });
        EXPECT_NE(result, 0);
        EXPECT_EQ(leaks, 0);
        EXPECT_EQ(stack_.traces_of(secret), 0);
        EXPECT_EQ(stack_.traces_of(key_bytes_), 0);
    }
}

TEST_P(PasswordTraces, DecodingLeavesNone) {
    std::string clear;
    while (clear.size() + secret.size() <= CFG32_PASSWORD_MAX)
        clear += secret;
    for (const std::string& text : {secret, clear}) {
        const std::string encoded = encode(text, key_.get());
        char* decoded = nullptr;
        int leaks = 0;
        stack_.run([&] {
            const free_watch watch(std::string_view(secret).substr(0, piece));
            unformat_password(encoded.c_str(), &decoded, key_.get(), 0);
            leaks = watch.leaks();
        });
        EXPECT_EQ(decoded, text);
        EXPECT_EQ(leaks, 0);
        EXPECT_EQ(stack_.traces_of(secret), 0);
        EXPECT_EQ(stack_.traces_of(key_bytes_), 0);
        _slapd_utils_decode_buffer_free(&decoded);
    }
}

TEST_P(PasswordTraces, AFailedDecodingLeavesNone) {
    std::string encoded = encode(secret, key_.get());
    char& last = encoded[encoded.size() - 3];
    last = last == 'A' ? 'B' : 'A';
    char* decoded = nullptr;
    stack_.run([&] { unformat_password(encoded.c_str(), &decoded, key_.get(), 0); });
    EXPECT_EQ(decoded, nullptr);
    EXPECT_EQ(stack_.traces_of(secret), 0);
}

// Run by itself, as the test driver does, this is the process's first use of everything below.
TEST(PasswordFormatTraces, TheFirstDecodingLeavesNone) {
    const char* encoded =
        "{iMASK}>EaChoqOkpaanqKmqqwGQ3tgaFmYuRZuptcmMljkkt5/u7Qmucknjf0Jg2mRq+u5mzaK99bSj"
        "06d/sttOYqxASt8RmZRkyLwugTGODc3uSc6Y/bmU1MDc2wh7C20TwgVMhR9Hz15FWgQ=";
    char* decoded = nullptr;
    searched_stack stack;
    stack.run([&] { unformat_password(encoded, &decoded, nullptr, 0); });
    ASSERT_NE(decoded, nullptr);
    EXPECT_EQ(std::string_view(decoded).substr(0, secret.size()), secret);
    EXPECT_EQ(stack.traces_of(secret), 0);
    _slapd_utils_decode_buffer_free(&decoded);
}

TEST(PasswordFormatTraces, RecognisingAMaskedTextLeavesNone) {
    const std::string stored = encode(secret).substr(7);
    searched_stack stack;
    int answer = -1;
    stack.run([&] { answer = check_format(stored.c_str(), static_cast<int>(stored.size())); });
    EXPECT_EQ(answer, 0);
    EXPECT_EQ(stack.traces_of(secret), 0);
}

}  // namespace
