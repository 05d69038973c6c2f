/*
 * The program's own malloc, free and their kin, which the library's calls, operator new among them,
 * find before the C library's. They fail when they are told to, count the live blocks, and can look
 * at a block when it is freed.
 */
#ifndef CFG32_TESTS_API_ALLOCATOR_H
#define CFG32_TESTS_API_ALLOCATOR_H

#include <stddef.h>

enum { call_malloc = 1, call_calloc = 2, call_strdup = 4, call_any = 7 };

/** The nth call of these kinds fails, counted from now on. */
void fail_call(unsigned kinds, long n);
/** So do all that follow it. */
void fail_calls_from(unsigned kinds, long n);
/** All calls of these kinds fail. */
void fail_all_calls(unsigned kinds);
/** From now on no call fails. Returns the number of calls that did. */
long stop_failing(void);

/** The number of blocks that were allocated and not yet freed. */
long live_blocks(void);

/** Keeps what the block's first bytes are when it is freed. */
void watch_block(const void *block, size_t size);
/** Those bytes, null when the block was not freed yet. */
const unsigned char *freed_bytes(void);

/** Counts the blocks that are freed while they hold this text; null ends that. */
void watch_text(const char *text);
long freed_with_text(void);

#endif
