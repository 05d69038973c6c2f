/*
 * cfg32_platform.h - the routines that the directory server provides to cfg32.
 *
 * cfg32 calls these routines and does not contain them. A server that has its own links them in
 * under these names; everybody else uses the default version, libcfg32platform, which this header
 * documents. A routine that the host program itself defines under one of these names takes
 * precedence over the default version.
 *
 * Conventions
 *
 * 1. C linkage, C99 and C++. No routine lets an exception out; exhausted memory is a failure like
 *    any other.
 * 2. Threads: every routine may be called from any number of threads at the same time. Key data may
 *    be shared by threads as long as none of them frees it. getNUVInstallPath reads the environment
 *    and so must not run while another thread changes it.
 * 3. Ownership: who frees a result, and with which call, stands with each routine.
 * 4. Texts that name files are handed to the system byte for byte. Scheme tags are compared without
 *    regard to the case of ASCII letters, whatever the locale.
 * 5. Secrets: clear texts, keys and every buffer that held one are wiped before they are released,
 *    on every path. A clear text that a routine hands out is the caller's to wipe.
 *
 * The encoded forms of a password
 *
 *    {AES128}B  {AES192}B  {AES256}B    encrypted, with a key of 16, 24 or 32 bytes
 *    {iMASK}>B                          masked, without a key
 *
 * B is base64 (RFC 4648 section 4, with padding, on one line) of
 *
 *    flags (1 byte), nonce (12 bytes), text (at most as long as the clear text), check (16 bytes)
 *
 * The flags' upper four bits hold the version, 1; bit 0 says that the text was compressed
 * (RFC 1951) before it was sealed; the other bits are 0. The text is sealed with AES-GCM
 * (NIST SP 800-38D); the tag in the spelling above (with the ">") and the flags byte are
 * authenticated with it. The nonce is fresh random data for each text; a key should be replaced
 * before it has sealed 2^32 texts (SP 800-38D section 8.3).
 *
 * Masking is obfuscation, not encryption: its key is a constant of this library, the same in every
 * installation. It keeps a password from being read over a shoulder and detects damage. Whoever has
 * the file and this library has the password.
 */
#ifndef CFG32_PLATFORM_H
#define CFG32_PLATFORM_H

#include <pthread.h>
#include <stdbool.h>
#include <stddef.h>
#include <sys/types.h>

#if defined(__GNUC__)
#define CFG32_PLATFORM_API __attribute__((visibility("default")))
#define CFG32_PLATFORM_PRINTF(format_index, first_argument) \
    __attribute__((format(printf, format_index, first_argument)))
#else
#define CFG32_PLATFORM_API
#define CFG32_PLATFORM_PRINTF(format_index, first_argument)
#endif

#if defined(__cplusplus) && __cplusplus >= 201103L
#define CFG32_PLATFORM_NOEXCEPT noexcept
#else
#define CFG32_PLATFORM_NOEXCEPT
#endif

/** The longest clear text, in bytes, that format_password encodes and unformat_password yields. */
#define CFG32_PASSWORD_MAX 1024

/** The scheme selector and the flag that the password routines know; they refuse all others. */
#define CFG32_PASSWORD_SELECTOR 133
#define CFG32_PASSWORD_FLAG 0

#ifdef __cplusplus
extern "C" {
#endif

/** Key material for the password routines. Its layout belongs to the library that made it. */
struct aes_key_data;

/* ---------------------------------------------------------------------------------------------
 * Installation, formatting, locale
 * ------------------------------------------------------------------------------------------ */

/**
 * Tells the server's installation directory.
 *
 * It is the value of the environment variable NUV_INSTALL_PATH if that is set and not empty, else
 * the prefix that the library was configured with if that is not empty. In a program that runs with
 * raised privileges (set-user-ID, set-group-ID, file capabilities) the environment is the caller's
 * and not to be trusted: the variable is ignored there, see secure_getenv(3).
 *
 * @return the path, allocated with malloc, to be released with free; null when neither source names
 *         a directory or memory is exhausted. The path is not checked for existence.
 */
CFG32_PLATFORM_API char *getNUVInstallPath(void) CFG32_PLATFORM_NOEXCEPT;

/**
 * Formats a text into a buffer of bounded size; the contract is that of snprintf (C99 7.19.6.5).
 *
 * @param buffer where the text goes, always NUL-terminated if size is not 0; may be null if it is
 * @param size   the buffer's size in bytes, its terminating NUL included
 * @param format the printf format
 * @return the length in bytes, without the NUL, that the whole text has or would have had; a result
 *         of size or more means that the text was cut. Negative on a format or encoding error.
 */
CFG32_PLATFORM_API int nuv_snprintf(char *buffer, size_t size, const char *format,
                                    ...) CFG32_PLATFORM_NOEXCEPT CFG32_PLATFORM_PRINTF(3, 4);

/**
 * Serialises setlocale within the process: hold it around every call that changes the locale.
 *
 * Not recursive. It is usable from the program's first instruction on, before and after
 * initLocaleMutex.
 */
extern CFG32_PLATFORM_API pthread_mutex_t set_locale_mutex;

/**
 * Makes set_locale_mutex usable. May be called any number of times, from any thread, also while the
 * mutex is held: it never disturbs a holder.
 */
CFG32_PLATFORM_API void initLocaleMutex(void) CFG32_PLATFORM_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Files
 * ------------------------------------------------------------------------------------------ */

/**
 * Copies a file so that the target is, at every instant and after a crash, either what it was
 * before or the complete copy.
 *
 * The copy is made under a temporary name (".cfg32-", 16 hexadecimal digits, ".tmp") in the
 * target's directory, readable by nobody but the calling user; it gets owner, group and permission
 * bits, is synced and then takes the target's name by rename(2); the directory is synced last.
 *
 * @param source the file to copy: a regular file, or a symbolic link to one, opened without ever
 *               blocking.
 * @param target the copy's name. An existing regular file is replaced, and so is a symbolic link:
 *               the link itself, not the file it points to. Anything else (directory, FIFO, device,
 *               or a link to one) is refused. The target's directory must be readable.
 * @param owner  the copy's owner by name; null for the source's, where the caller may give it
 * @param group  the copy's group by name; null for the source's, and for no access of the group
 *               where the caller may not give it
 * @param mode   the copy's permission bits; only the bits in 07777 count, the umask doesn't. Access
 *               control lists are not copied, and none is inherited from the directory; the copy of
 *               a file with such a list gives its group no access.
 * @return true on success; false on any failure, with errno saying why. In particular: EINVAL for a
 *         null name, an owner or group that doesn't exist, a source that is not a regular file, a
 *         target that can't be replaced, or when both names mean the same file (by name, hard or
 *         symbolic link); EISDIR when either is a directory; EPERM when the owner can't be given;
 *         EAGAIN when the source was written to meanwhile.
 *         On failure the temporary file is removed and the target is untouched, with one exception:
 *         when syncing the directory fails, the complete copy already bears the target's name, but
 *         it isn't certain that the name survives a crash.
 */
CFG32_PLATFORM_API bool copyFile(const char *source, const char *target, const char *owner,
                                 const char *group, mode_t mode) CFG32_PLATFORM_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Passwords
 * ------------------------------------------------------------------------------------------ */

/**
 * Tells whether a text is a clear-text password or already encoded.
 *
 * Encoded are: a text that begins with one of the tags {SHA} {SSHA} {MD5} {crypt} {AES128} {AES192}
 * {AES256} {VLDL} {iMASK} (in any case, RFC 3112 practice) and goes on after it; and a complete
 * masked form without its tag, ">..." whose check value verifies. A password that merely begins
 * with ">" is clear.
 *
 * @param text   the text; a NUL ends it. Null counts as clear.
 * @param length its length in bytes; a negative length counts as clear
 * @return 1 for clear text that still needs encoding, 0 for encoded text
 */
CFG32_PLATFORM_API int check_format(const char *text, int length) CFG32_PLATFORM_NOEXCEPT;

/**
 * Encodes a clear-text password: encrypted if there is a key, else masked.
 *
 * Encoding the same text twice gives two different results. Into a buffer of 1024 bytes goes every
 * clear text of up to 730 bytes, and a longer one (up to CFG32_PASSWORD_MAX) if it can be
 * compressed to that size. A text is never cut: what doesn't fit is refused.
 *
 * @param selector the scheme selector, CFG32_PASSWORD_SELECTOR
 * @param flag     CFG32_PASSWORD_FLAG
 * @param key      the key, whose size chooses {AES128}, {AES192} or {AES256}; null for masking
 * @param clear    the clear text; not null. Need not be NUL-terminated.
 * @param length   its length in bytes, 0 to CFG32_PASSWORD_MAX; no byte may be NUL
 * @param out      where the encoded text goes, NUL-terminated printable ASCII
 * @param out_size the size of out in bytes, its terminating NUL included
 * @return 1 on success; 0 on failure (an argument outside these bounds, a text that doesn't fit, no
 *         random data, exhausted memory), with all of out overwritten with zeros
 */
CFG32_PLATFORM_API int format_password(int selector, int flag, struct aes_key_data *key,
                                       const char *clear, int length, char *out,
                                       int out_size) CFG32_PLATFORM_NOEXCEPT;

/**
 * Decodes an encrypted or masked password. Hashed passwords ({SHA}, {SSHA}, {MD5}, {crypt}, {VLDL})
 * and texts in no encoded form can't be decoded.
 *
 * @param encoded the encoded text, NUL-terminated; a masked form may lack its {iMASK} tag
 * @param clear   receives the clear text, allocated with malloc and NUL-terminated. The caller
 *                releases it with _slapd_utils_decode_buffer_free, or wipes it and calls free. Left
 *                as it is on failure.
 * @param key     the key that the text was encrypted with; not looked at for a masked text
 * @param flag    CFG32_PASSWORD_FLAG
 * @return 1 on success; 0 on failure: no such form, no key, a key of another size or value, a text
 *         that was changed in any byte, exhausted memory
 */
CFG32_PLATFORM_API int unformat_password(const char *encoded, char **clear,
                                         struct aes_key_data *key,
                                         int flag) CFG32_PLATFORM_NOEXCEPT;

/**
 * Wipes and frees a clear text that unformat_password handed out, and sets the pointer to null.
 *
 * @param clear the address of the pointer; null, and a pointer to null, are allowed
 */
CFG32_PLATFORM_API void _slapd_utils_decode_buffer_free(char **clear) CFG32_PLATFORM_NOEXCEPT;

/* ---------------------------------------------------------------------------------------------
 * Key data of the default version
 * ------------------------------------------------------------------------------------------ */

/**
 * Makes key data from raw bytes, which are copied.
 *
 * @param bytes the key
 * @param size  its size in bytes: 16, 24 or 32
 * @return the key data, released with aes_key_data_free; null with errno EINVAL for null bytes or
 *         another size, ENOMEM when memory is exhausted
 */
CFG32_PLATFORM_API struct aes_key_data *aes_key_data_from_bytes(
    const unsigned char *bytes, size_t size) CFG32_PLATFORM_NOEXCEPT;

/**
 * Reads key data from a file that holds exactly the raw key: 16, 24 or 32 bytes.
 *
 * Opening never blocks. The permissions are those of the file that was opened, not of the name.
 *
 * @param path the key file: a regular file, or a symbolic link to one, on which neither its group
 *             nor others have any permission
 * @return the key data, released with aes_key_data_free; null with errno EACCES when others have
 * any permission, EINVAL for a null path, a file that is not regular or of another size, else as
 *         open(2) and read(2) set it
 */
CFG32_PLATFORM_API struct aes_key_data *aes_key_data_from_file(const char *path)
    CFG32_PLATFORM_NOEXCEPT;

/**
 * Wipes and frees key data. No handle that was given the key may be used afterwards.
 *
 * @param key the key data; null is allowed
 */
CFG32_PLATFORM_API void aes_key_data_free(struct aes_key_data *key) CFG32_PLATFORM_NOEXCEPT;

#ifdef __cplusplus
}
#endif

#endif /* CFG32_PLATFORM_H */
