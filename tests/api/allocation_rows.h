/*
 * The exported calls as a table: what each is made on, and its answer as a text.
 */
#ifndef CFG32_TESTS_API_ALLOCATION_ROWS_H
#define CFG32_TESTS_API_ALLOCATION_ROWS_H

#include <stdio.h>

#include "fixture.h"

/** What a call is made on, and what it gives. */
struct scene {
    struct fixture *f;
    char *example; /**< the text of the example configuration */
    char *backup;  /**< the path of the backup */
    struct aes_key_data *key;
    int files; /**< in the folder */

    CfgHandle *handle;
    CfgMessage *result;
    CfgCursor *cursor;
    char **values;
    char *text;
    const void *seen; /**< what stays the library's */
    int code;
};

enum {
    loses_a_block = 1, /**< the C library does, when it fails in the middle of its own work */
    repairs_first = 2  /**< what is unusable in the file, before it can fail in other ways */
};

/** One call in one circumstance. */
struct row {
    const char *call;
    const char *of;
    void (*prepare)(struct scene *s); /**< with a fresh handle, and the example as the file */
    void (*make)(struct scene *s);    /**< the call, and nothing else that allocates */
    void (*tell)(struct scene *s, FILE *out); /**< prints the answer, and frees it */
    const char *answer;                       /**< a line of it, when nothing fails */
    const char *failures;    /**< what it answers without memory, separated by "|"; null: never */
    const char *done_before; /**< what it answers when its change was made in memory already */
    unsigned besides;        /**< of the flags below */
};

/** Every exported call; ended by one without a name. */
extern const struct row allocation_rows[];

#endif
