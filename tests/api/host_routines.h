/*
 * A host program's own versions of the server's routines. They keep what they were called with and
 * do what the test tells them.
 *
 * Passwords: "{HOST}text" and "{iMASK}>text" stand for text. Encoded are texts that begin with
 * "{HOST}" or ">", and the empty text.
 */
#ifndef CFG32_TESTS_API_HOST_ROUTINES_H
#define CFG32_TESTS_API_HOST_ROUTINES_H

#include <stddef.h>
#include <sys/types.h>

struct aes_key_data;

struct host_record {
    /* What the routines answer. */
    const char *install_path; /**< null: no installation directory */
    int copy_succeeds;
    int decode_result; /**< what unformat_password returns for a text that it can decode */
    int decodable;     /**< how many texts it can decode before it fails; 0: all */
    void (*on_clear)(const char *clear); /**< called with a clear text that is handed out */

    /* What they were called with. */
    int initialised_locale;
    int formatted;

    int copied;
    char copy_source[512];
    char copy_target[512];
    char copy_owner[64]; /**< "(null)" for a null pointer, here and below */
    char copy_group[64];
    mode_t copy_mode;

    int encoded;
    int encode_selector;
    int encode_flag;
    struct aes_key_data *encode_key;
    char encode_text[1100];
    int encode_length;
    int encode_size;
    int encode_buffer_was_zero;

    int decoded;
    char decode_text[2200];
    struct aes_key_data *decode_key;
    int decode_flag;
    int decode_result_was_null;

    int freed; /**< clear texts given back */
};

extern struct host_record host;

/** Forgets all calls; an installation path of "/host", copies and decoding succeed. */
void reset_host(void);

#endif
