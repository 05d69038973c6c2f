#include "allocator.h"

#include <errno.h>
#include <malloc.h>
#include <stdlib.h>
#include <string.h>

/* The allocator below this one, by the names that it keeps for those that stand before it: the
 * sanitizer's, which then sees every block, or the C library's. */
#ifdef __SANITIZE_ADDRESS__
#define BELOW(call) __interceptor_##call
#else
#define BELOW(call) __libc_##call
#endif
extern void *BELOW(malloc)(size_t size);
extern void *BELOW(calloc)(size_t count, size_t size);
extern void *BELOW(realloc)(void *block, size_t size);
extern void *BELOW(memalign)(size_t alignment, size_t size);
extern void BELOW(free)(void *block);

static struct {
    unsigned kinds;
    long until; /* the calls up to the one that fails; 0: it has failed, and so do all from there */
    int is_lasting;
    long failed;
    long live;
    const void *watched;
    size_t watched_size;
    int watched_was_freed;
    unsigned char bytes[2048];
    const char *text;
    long freed_with_text;
} allocator;

static int fails(unsigned kind) {
    if (!(allocator.kinds & kind) || (allocator.until > 0 && --allocator.until > 0)) {
        return 0;
    }
    if (!allocator.is_lasting) {
        allocator.kinds = 0;
    }
    ++allocator.failed;
    errno = ENOMEM;
    return 1;
}

static void *counted(void *block) {
    allocator.live += block != NULL;
    return block;
}

void *malloc(size_t size) { return fails(call_malloc) ? NULL : counted(BELOW(malloc)(size)); }

void *calloc(size_t count, size_t size) {
    return fails(call_calloc) ? NULL : counted(BELOW(calloc)(count, size));
}

void *realloc(void *block, size_t size) {
    if (fails(call_malloc)) {
        return NULL;
    }
    return block ? BELOW(realloc)(block, size) : counted(BELOW(realloc)(NULL, size));
}

void *reallocarray(void *block, size_t count, size_t size) {
    if (size != 0 && count > (size_t)-1 / size) {
        errno = ENOMEM;
        return NULL;
    }
    return realloc(block, count * size);
}

void *memalign(size_t alignment, size_t size) {
    return fails(call_malloc) ? NULL : counted(BELOW(memalign)(alignment, size));
}

void *aligned_alloc(size_t alignment, size_t size) { return memalign(alignment, size); }

int posix_memalign(void **block, size_t alignment, size_t size) {
    void *made = memalign(alignment, size);
    if (!made) {
        return ENOMEM;
    }
    *block = made;
    return 0;
}

static char *copy_of(const char *text, size_t length) {
    char *copy = fails(call_strdup) ? NULL : counted(BELOW(malloc)(length + 1));
    if (copy) {
        memcpy(copy, text, length);
        copy[length] = '\0';
    }
    return copy;
}

char *strdup(const char *text) { return copy_of(text, strlen(text)); }

char *strndup(const char *text, size_t size) { return copy_of(text, strnlen(text, size)); }

void free(void *block) {
    if (!block) {
        return;
    }
    if (block == allocator.watched) {
        memcpy(allocator.bytes, block, allocator.watched_size);
        allocator.watched_was_freed = 1;
        allocator.watched = NULL;
    }
    if (allocator.text && malloc_usable_size(block) > strlen(allocator.text) &&
        memcmp(block, allocator.text, strlen(allocator.text)) == 0) {
        ++allocator.freed_with_text;
    }
    --allocator.live;
    BELOW(free)(block);
}

static void fail_from(unsigned kinds, long n, int is_lasting) {
    allocator.failed = 0;
    allocator.until = n;
    allocator.is_lasting = is_lasting;
    allocator.kinds = kinds;
}

void fail_call(unsigned kinds, long n) { fail_from(kinds, n, 0); }

void fail_calls_from(unsigned kinds, long n) { fail_from(kinds, n, 1); }

void fail_all_calls(unsigned kinds) { fail_calls_from(kinds, 1); }

long stop_failing(void) {
    allocator.kinds = 0;
    return allocator.failed;
}

long live_blocks(void) { return allocator.live; }

void watch_block(const void *block, size_t size) {
    allocator.watched = block;
    allocator.watched_size = size < sizeof allocator.bytes ? size : sizeof allocator.bytes;
    allocator.watched_was_freed = 0;
}

const unsigned char *freed_bytes(void) {
    return allocator.watched_was_freed ? allocator.bytes : NULL;
}

void watch_text(const char *text) {
    allocator.text = text;
    allocator.freed_with_text = 0;
}

long freed_with_text(void) { return allocator.freed_with_text; }
