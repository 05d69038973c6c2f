#pragma once

// The word lists that rows of the attribute table point at, each ended by null.

namespace cfg32::enumerations {

inline constexpr const char* const* none = nullptr;

// clang-format off

inline constexpr const char* enumBoolean[] = {"true", "false", nullptr};

inline constexpr const char* enumPwEncryption[] = {
    "none", "crypt", "sha", "ssha", "md5", "aes128", "aes192", "aes256",
    nullptr};

inline constexpr const char* enumSchemaCheck[] = {"none", "V2", "V3", "V3_lenient", nullptr};

inline constexpr const char* enumSecurity[] = {"none", "SSL", "SSLOnly", "TLS", "SSLTLS", nullptr};

inline constexpr const char* enumSslAuth[] = {"ServerAuth", "ServerClientAuth", nullptr};

inline constexpr const char* enumSysLogLevel[] = {"l", "m", "h", nullptr};

inline constexpr const char* enumDerefAliases[] = {"never", "find", "search", "always", nullptr};

// KEPT: two lists in one. The first runs on into the second, so that all six words are accepted
// where the first four belong.
inline constexpr const char* thread_conditions_and_roles[] = {
    "S", "T", "SOT", "SAT",  // enumETStatCond
    "any", "primarywrite",   // enumServerRole
    nullptr};
inline constexpr const char* const* enumETStatCond = thread_conditions_and_roles;
inline constexpr const char* const* enumServerRole = thread_conditions_and_roles + 4;

inline constexpr const char* enumAdminRole[] = {
    "AuditAdmin", "DirDataAdmin", "NoAdmin", "ReplicationAdmin", "SchemaAdmin",
    "ServerConfigGroupMember", "ServerStartStopAdmin", "PasswordAdmin",
    nullptr};

inline constexpr const char* enumAcceleratorMode[] = {
    "none", "DIGEST", "SYMMETRIC", "RANDOM",
    nullptr};

inline constexpr const char* enumFrequency[] = {
    "month", "15day", "week", "day",
    "12hr", "8hr", "6hr", "4hr", "3hr", "2hr", "hr",
    "45min", "30min", "15min", "5min", "min",
    nullptr};

inline constexpr const char* enumEventFmt[] = {"CBE", nullptr};

inline constexpr const char* enumAuditOp[] = {
    "ALL", "AUDITCONFIGMODIFYFROMMSG", "AUDITCONFIGMODIFY", "AUDITSTART", "AUDITSTOP", "BIND",
    "CLEARSERVERLOG", "PWDPOLICYCONFIGMODIFY", "REREADSERVERCONFIG", "SERVERCONFIGMODIFY",
    "SERVERSTART", "SERVERSTOP", "UNBIND", "USERPWDMODIFY", "USERPWDMODIFYBYANOTHER",
    nullptr};

// Reported to callers, not enforced by the url and oid syntaxes.
inline constexpr const char* urlLdap[] = {"ldap", "ldaps", nullptr};
inline constexpr const char* oidACI[] = {"1.3.99.0.2.26.1", "1.3.99.0.2.26.2", nullptr};

// clang-format on

}  // namespace cfg32::enumerations
