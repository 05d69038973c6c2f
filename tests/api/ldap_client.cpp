// The same program in the other language.
#include "ldap_client.c"
