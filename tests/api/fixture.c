#include "fixture.h"

#include <dirent.h>
#include <fcntl.h>
#include <langinfo.h>
#include <pthread.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

const char *const standard_configuration = CONFIGURATION_HEAD
    "\n"
    "dn: cn=Front End, cn=Configuration\n"
    "cn: Front End\n"
    "objectclass: top\n"
    "oru-slapdPort: 389\n"
    "oru-slapdSetenv: TZ=Europe/Berlin\n"
    "oru-slapdSetenv: A=first\n"
    "description: first line,\n"
    "  continued\n"
    "\n"
    "dn: cn=Caches, cn=Front End, cn=Configuration\n"
    "cn: Caches\n"
    "objectclass: top\n"
    "note:\n"
    "\n"
    "dn: cn=Replicas, cn=Configuration\n"
    "cn: Replicas\n"
    "objectclass: list\n";

/* ---- set-up ---- */

static int make_folder(struct fixture *f) {
    const char *parent = getenv("TMPDIR");
    snprintf(f->folder, sizeof f->folder, "%.80s/cfg32-api-XXXXXX",
             parent && *parent ? parent : "/tmp");
    return mkdtemp(f->folder) ? 0 : -1;
}

/* Removes a folder with the files and folders in it. */
static void remove_folder(const char *folder) {
    DIR *stream = opendir(folder);
    const struct dirent *entry;
    while (stream && (entry = readdir(stream))) {
        char path[512];
        if (strcmp(entry->d_name, ".") == 0 || strcmp(entry->d_name, "..") == 0) {
            continue;
        }
        snprintf(path, sizeof path, "%.200s/%.255s", folder, entry->d_name);
        if (unlink(path) != 0) {
            remove_folder(path);
        }
    }
    if (stream) {
        closedir(stream);
    }
    rmdir(folder);
}

int set_up(void **state) {
    struct fixture *f = calloc(1, sizeof *f);
    if (!f || make_folder(f) != 0) {
        free(f);
        return -1;
    }
    *state = f;
    snprintf(f->config, sizeof f->config, "%s/oruslapd.conf", f->folder);
    write_configuration(f, standard_configuration);
    f->handle = cfg_init();
    return f->handle && cfg_set_option(f->handle, CFG_OPT_CONFIG_FILE, f->config) == 0 ? 0 : -1;
}

int set_up_bound(void **state) {
    if (set_up(state) != 0) {
        return -1;
    }
    struct fixture *f = *state;
    return bind_administrator(f->handle);
}

int tear_down(void **state) {
    struct fixture *f = *state;
    if (f->handle) {
        cfg_unbind(f->handle);
    }
    /* The two options that handles share go back to their first values. */
    CfgHandle *handle = cfg_init();
    cfg_unbind(handle);
    remove_folder(f->folder);
    free(f);
    return 0;
}

int is_utf8(void) { return strcmp(nl_langinfo(CODESET), "UTF-8") == 0; }

/* ---- files ---- */

char *path_of(const struct fixture *f, const char *name) {
    const size_t size = strlen(f->folder) + strlen(name) + 2;
    char *path = malloc(size);
    assert_non_null(path);
    snprintf(path, size, "%s/%s", f->folder, name);
    return path;
}

void write_file(const char *path, const char *text) {
    static long files_written;
    struct timespec times[2] = {{0, UTIME_OMIT}, {0, 0}};
    FILE *stream = fopen(path, "wb");
    assert_non_null(stream);
    assert_int_equal(fwrite(text, 1, strlen(text), stream), strlen(text));
    assert_int_equal(fclose(stream), 0);
    times[1].tv_sec = 1000000000 + ++files_written;
    assert_int_equal(utimensat(AT_FDCWD, path, times, 0), 0);
}

void write_configuration(const struct fixture *f, const char *text) { write_file(f->config, text); }

char *read_file(const char *path) {
    FILE *stream = fopen(path, "rb");
    assert_non_null(stream);
    size_t length = 0;
    size_t size = 1 << 16;
    char *text = malloc(size);
    assert_non_null(text);
    while ((length += fread(text + length, 1, size - length - 1, stream)) == size - 1) {
        text = realloc(text, size *= 2);
        assert_non_null(text);
    }
    text[length] = '\0';
    fclose(stream);
    return text;
}

int file_exists(const char *path) {
    struct stat status;
    return lstat(path, &status) == 0;
}

/* ---- handles ---- */

int bind_administrator(CfgHandle *handle) {
    return cfg_bind_s(handle, ADMINISTRATOR, PASSWORD, CFG_AUTH_SIMPLE);
}

void load(const struct fixture *f, const char *text) {
    write_configuration(f, text);
    assert_int_equal(bind_administrator(f->handle), CFG_SUCCESS);
}

CfgMessage *found(CfgHandle *handle, const char *base, int scope, const char *filter,
                  char **attrs) {
    CfgMessage *result = NULL;
    assert_int_equal(cfg_search_s(handle, base, scope, filter, attrs, 0, &result), CFG_SUCCESS);
    return result;
}

int search_below(CfgHandle *handle, const char *base, const char *filter) {
    CfgMessage *result = NULL;
    const int code = cfg_search_s(handle, base, CFG_SCOPE_SUBTREE, filter, NULL, 0, &result);
    assert_true(code == CFG_SUCCESS || !result);
    cfg_msgfree(result);
    return code;
}

int search_all(CfgHandle *handle) {
    return search_below(handle, "cn=Configuration", "objectclass=*");
}

int modify_one(CfgHandle *handle, const char *dn, int operation, const char *name,
               const char *value) {
    char *values[] = {(char *)value, NULL};
    LDAPMod change = {
        .mod_op = operation, .mod_type = (char *)name, .mod_values = value ? values : NULL};
    LDAPMod *changes[] = {&change, NULL};
    return cfg_modify_s(handle, dn, changes);
}

/* ---- expectations ---- */

void assert_text(const char *text, const char *expected) {
    if (!expected) {
        assert_null(text);
        return;
    }
    assert_non_null(text);
    assert_string_equal(text, expected);
}

void assert_report_has(CfgHandle *handle, int code, const char *text) {
    assert_int_equal(cfg_get_errno(handle), code);
    const char *report = cfg_dump_exception(handle);
    assert_non_null(report);
    if (!strstr(report, text)) {
        fail_msg("no \"%s\" in the report:\n%s", text, report);
    }
}

void assert_no_report(CfgHandle *handle, int code) {
    assert_int_equal(cfg_get_errno(handle), code);
    assert_int_equal(cfg_get_exterror(handle), code);
    assert_null(cfg_dump_exception(handle));
}

char *report_without_lines(CfgHandle *handle) {
    const char *report = cfg_dump_exception(handle);
    assert_non_null(report);
    char *text = calloc(1, strlen(report) + 1);
    assert_non_null(text);
    char *out = text;
    int is_position = *report == '[';
    while (*report) {
        if (is_position && *report == ':') {
            const size_t digits = strspn(report + 1, "0123456789");
            assert_true(digits > 0 && strtol(report + 1, NULL, 10) > 0);
            *out++ = ':';
            *out++ = '#';
            report += 1 + digits;
            is_position = 0;
            continue;
        }
        if (report[0] == '\n' && report[1] == '[') {
            is_position = 1;
        }
        *out++ = *report++;
    }
    return text;
}

/* Appends to a growing text. */
static void append(char **text, const char *part) {
    const size_t old = *text ? strlen(*text) : 0;
    *text = realloc(*text, old + strlen(part) + 1);
    assert_non_null(*text);
    strcpy(*text + old, part);
}

void assert_dns(CfgHandle *handle, CfgMessage *result, const char *expected) {
    char *text = NULL;
    append(&text, "");
    for (CfgMessage *entry = cfg_first_entry(handle, result); entry;
         entry = cfg_next_entry(handle, entry)) {
        char *dn = cfg_get_dn(handle, entry);
        assert_non_null(dn);
        append(&text, dn);
        append(&text, "\n");
        cfg_memfree(dn);
    }
    assert_string_equal(text, expected);
    free(text);
}

void assert_attributes(CfgHandle *handle, CfgMessage *entry, const char *expected) {
    char *text = NULL;
    CfgCursor *cursor = NULL;
    append(&text, "");
    for (char *name = cfg_first_attribute(handle, entry, &cursor); name;
         name = cfg_next_attribute(handle, entry, cursor)) {
        append(&text, *text ? " " : "");
        append(&text, name);
        cfg_memfree(name);
    }
    cfg_ber_free(cursor);
    assert_string_equal(text, expected);
    free(text);
}

void assert_values(CfgHandle *handle, CfgMessage *entry, const char *attribute,
                   const char *expected) {
    char *text = NULL;
    char **values = cfg_get_values(handle, entry, attribute);
    assert_non_null(values);
    append(&text, "");
    for (char **value = values; *value; ++value) {
        append(&text, value == values ? "" : "|");
        append(&text, *value);
    }
    cfg_value_free(values);
    assert_string_equal(text, expected);
    free(text);
}

static void *free_result(void *result) {
    return cfg_msgfree(result) == CFG_SUCCESS ? result : NULL;
}

void free_on_a_stack_of(size_t size, CfgMessage *result) {
    pthread_attr_t attributes;
    pthread_t thread;
    void *done = NULL;
    assert_int_equal(pthread_attr_init(&attributes), 0);
    assert_int_equal(pthread_attr_setstacksize(&attributes, size), 0);
    assert_int_equal(pthread_create(&thread, &attributes, free_result, result), 0);
    assert_int_equal(pthread_join(thread, &done), 0);
    assert_ptr_equal(done, result);
    pthread_attr_destroy(&attributes);
}
