/* A shared library that uses the platform's routines, as cfg32 itself does. */
#include "cfg32_platform.h"

int caller_check_format(const char* text);
char* caller_install_path(void);

int caller_check_format(const char* text) { return check_format(text, 6); }
char* caller_install_path(void) { return getNUVInstallPath(); }
