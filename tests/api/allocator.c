#include "allocator.h"

#include <errno.h>
#include <stdlib.h>
#include <string.h>

/* The C library's own, by the names that it keeps for allocators that stand before it. */
extern void *__libc_malloc(size_t size);
extern void *__libc_calloc(size_t count, size_t size);
extern void *__libc_realloc(void *block, size_t size);
extern void __libc_free(void *block);

static struct {
    unsigned kinds;
    long until; /* the calls before the one that fails; negative: all fail */
    long failed;
    long live;
    const void *watched;
    size_t watched_size;
    int watched_was_freed;
    unsigned char bytes[2048];
} allocator;

static int fails(unsigned kind) {
    if (!(allocator.kinds & kind) || (allocator.until >= 0 && --allocator.until != 0)) {
        return 0;
    }
    if (allocator.until == 0) {
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

void *malloc(size_t size) { return fails(call_malloc) ? NULL : counted(__libc_malloc(size)); }

void *calloc(size_t count, size_t size) {
    return fails(call_calloc) ? NULL : counted(__libc_calloc(count, size));
}

void *realloc(void *block, size_t size) {
    if (fails(call_malloc)) {
        return NULL;
    }
    return block ? __libc_realloc(block, size) : counted(__libc_realloc(NULL, size));
}

char *strdup(const char *text) {
    if (fails(call_strdup)) {
        return NULL;
    }
    char *copy = counted(__libc_malloc(strlen(text) + 1));
    return copy ? strcpy(copy, text) : NULL;
}

void free(void *block) {
    if (!block) {
        return;
    }
    if (block == allocator.watched) {
        memcpy(allocator.bytes, block, allocator.watched_size);
        allocator.watched_was_freed = 1;
        allocator.watched = NULL;
    }
    --allocator.live;
    __libc_free(block);
}

void fail_call(unsigned kinds, long n) {
    allocator.failed = 0;
    allocator.until = n;
    allocator.kinds = kinds;
}

void fail_all_calls(unsigned kinds) { fail_call(kinds, -1); }

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
