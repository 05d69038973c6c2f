#include "LDIF_AttrType.h"

#include <gtest/gtest.h>
#include <strings.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <map>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "LDIF_Value.h"
#include "failing_new.h"

using namespace cfg32::tests;

namespace {

constexpr int64_t MAX = std::numeric_limits<int64_t>::max();
constexpr bool single = true;
constexpr bool multi = false;

// --- the expected table, in its stored order ------------------------------------------------

struct expected_row {
    const char* name;
    const char* family;
    const char* words;  // a word list or a bit mask
    int64_t minimum;
    int64_t maximum;
    bool is_single;
};

const expected_row expected_rows[] = {
    {"charset", "ces", "", 0, 0, single},
    {"version", "int", "", 1, 1, single},
    {"cn", "cis", "", 0, 0, single},
    {"objectclass", "cis", "", 0, 0, multi},
    {"oru-slapdAdminDN", "dn", "", 0, 0, single},
    {"oru-slapdAdminPW", "pw", "", 1, 1024, single},
    {"oru-slapdAdminRole", "enum", "enumAdminRole", 0, 0, multi},
    {"oru-slapdAuthIntegration", "int", "", 0, MAX, single},
    {"oru-slapdChangeLogMaxEntries", "int", "", 0, MAX, single},
    {"oru-slapdChangeLogMaxAge", "int", "", 0, MAX, single},
    {"oru-slapdConcurrentRW", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdDbConnections", "int", "", 0, MAX, single},
    {"oru-slapdDbInstance", "ces", "", 1, 8, single},
    {"oru-slapdDbName", "ces", "", 1, 8, single},
    {"oru-slapdDbUserID", "ces", "", 1, 8, single},
    {"oru-slapdDbUserPW", "pw", "", 1, 1024, single},
    {"oru-slapdDigestEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdEnableEventNotification", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdEnablePersistentSearch", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdMaxPersistentSearches", "int", "", 0, 2000, single},
    {"oru-slapdErrorLog", "path", "", 1, 4096, single},
    {"oru-slapdIpAddress", "dc", "", 0, 0, single},
    {"oru-slapdIncludeSchema", "file", "", 1, 4096, multi},
    {"oru-slapdKrbAdminDN", "krbdn", "", 0, 0, single},
    {"oru-slapdKrbEnable", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdKrbIdentityMap", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdKrbKeyTab", "path", "", 0, 4096, single},
    {"oru-slapdKrbRealm", "dc", "", 0, 0, single},
    {"oru-slapdLdapCrlHost", "dc", "", 0, 0, single},
    {"oru-slapdLdapCrlPassword", "pw", "", 1, 1024, single},
    {"oru-slapdLdapCrlPort", "int", "", 1, 65535, single},
    {"oru-slapdLdapCrlUser", "dn", "", 0, 0, single},
    {"oru-slapdLogMessages", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdMasterDN", "dn", "", 0, 0, single},
    {"oru-slapdMasterPW", "pw", "", 1, 1024, single},
    {"oru-slapdMasterReferral", "url", "urlLdap", 0, 0, single},
    {"oru-slapdMaxEventsPerConnection", "int", "", 0, MAX, single},
    {"oru-slapdMaxEventsTotal", "int", "", 0, MAX, single},
    {"oru-slapdMaxNumOfTransactions", "int", "", 0, MAX, single},
    {"oru-slapdMaxOpPerTransaction", "int", "", 1, 500, single},
    {"oru-slapdMaxTimeLimitOfTransactions", "int", "", 0, MAX, single},
    {"oru-slapdMaxTimeBetweenPrepareAndCommit", "int", "", 0, MAX, single},
    {"oru-slapdPeerDN", "dn", "", 0, 0, single},
    {"oru-slapdPeerPW", "pw", "", 1, 1024, single},
    {"oru-slapdPlugin", "plugin", "", 0, 0, multi},
    {"oru-slapdDNPartitionPlugin", "plugin", "", 0, 0, single},
    {"oru-slapdPort", "int", "", 1, 65535, single},
    {"oru-slapdPwEncryption", "enum", "enumPwEncryption", 0, 0, single},
    {"oru-slapdReadOnly", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdReferral", "url", "urlLdap", 0, 0, multi},
    {"oru-slapdSchemaAdditions", "file", "", 1, 4096, single},
    {"oru-slapdSchemaCheck", "enum", "enumSchemaCheck", 0, 0, single},
    {"oru-slapdSecurePort", "int", "", 1, 65535, single},
    {"oru-slapdSecurity", "enum", "enumSecurity", 0, 0, single},
    {"oru-slapdSslPKCS11AcceleratorMode", "enum", "enumAcceleratorMode", 0, 0, multi},
    {"oru-slapdSetenv", "env", "", 0, 0, multi},
    {"oru-slapdSizeLimit", "int", "", 0, MAX, single},
    {"oru-slapdSslAuth", "enum", "enumSslAuth", 0, 0, single},
    {"oru-slapdSslCertificate", "ces", "", 0, 0, single},
    {"oru-slapdSslCipherSpecs", "mask", "mask 0xff00", 0, 0, single},
    {"oru-slapdSslKeyDatabase", "path", "", 0, 4096, single},
    {"oru-slapdSslKeyDatabasePW", "pw", "", 1, 1024, single},
    {"oru-slapdSslPKCS11TokenPW", "pw", "", 1, 1024, single},
    {"oru-slapdSuffix", "dn", "", 1, 0, multi},
    {"oru-slapdSupportedACIMechanisms", "oid", "oidACI", 0, 0, single},
    {"oru-slapdSysLogLevel", "enum", "enumSysLogLevel", 0, 0, single},
    {"oru-slapdTimeLimit", "int", "", 0, MAX, single},
    {"oru-slapdTransactionEnable", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdProxyHighConsistency", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdProxyAutoFailBack", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdUseProcessIdPw", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdSortSrchAllowNonAdmin", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdPagedResAllowNonAdmin", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdEnableRemotePWPExOps", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdSortKeyLimit", "int", "", 0, MAX, single},
    {"oru-slapdPagedResLmt", "int", "", 0, MAX, single},
    {"oru-slapdIdleTimeOut", "int", "", 0, MAX, single},
    {"oru-slapdVersion", "cis", "", 0, 0, single},
    {"oru-slapdACLCache", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdACLCacheSize", "int", "", 0, MAX, single},
    {"oru-slapdEntryCacheSize", "int", "", 0, MAX, single},
    {"oru-slapdFilterCacheBypassLimit", "int", "", 0, MAX, single},
    {"oru-slapdFilterCacheSize", "int", "", 0, MAX, single},
    {"oru-slapdWorkers", "int", "", 0, MAX, single},
    {"oru-slapdVX3CP", "int", "", 0, MAX, single},
    {"oru-slapdServerID", "ces", "", 0, 1024, single},
    {"oru-slapdReplDBConns", "int", "", 0, MAX, single},
    {"oru-slapdCLIErrors", "path", "", 1, 4096, single},
    {"oru-slapdBulkloadErrors", "path", "", 1, 4096, single},
    {"oru-slapdSslCipherSpec", "cis", "", 0, 0, single},
    {"oru-slapdSslFIPSModeEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdSslFIPSProcessingMode", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdSupportedWebAdmVersion", "cis", "", 0, 0, single},
    {"oru-slapdReplicaSubtree", "dn", "", 0, 0, single},
    {"oru-slapdDerefAliases", "enum", "enumDerefAliases", 0, 0, single},
    {"oru-slapdAdminGroupEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdAllowAnon", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdAnonReapingThreshold", "int", "", 0, MAX, single},
    {"oru-slapdBoundReapingThreshold", "int", "", 0, MAX, single},
    {"oru-slapdAllReapingThreshold", "int", "", 0, MAX, single},
    {"oru-slapdIdleTimeOut", "int", "", 0, MAX, single},
    {"oru-slapdWriteTimeout", "int", "", 0, MAX, single},
    {"oru-slapdESizeThreshold", "int", "", 0, MAX, single},
    {"oru-slapdETimeThreshold", "int", "", 0, MAX, single},
    {"oru-slapdEThreadEnable", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdEThreadActivate", "enum", "enumETStatCond", 0, 0, single},
    {"oru-slapdDigestAdminUser", "cis", "", 0, 0, single},
    {"oru-slapdStartupTraceEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdTraceMessageLog", "path", "", 1, 4096, single},
    {"oru-slapdTraceMessageLevel", "cis", "", 0, 0, single},
    {"oru-slapdCachedAttributeSize", "kilo", "", 0, 18014398509481982, single},
    {"oru-slapdCachedAttribute", "cis", "", 1, 256, multi},
    {"nuv-instanceVersion", "cis", "", 0, 0, single},
    {"nuv-instanceLocation", "path", "", 1, 4096, single},
    {"nuv-instanceDesc", "dc", "", 0, 0, single},
    {"oru-slapdMaxPendingChangesDisplayed", "int", "", 0, MAX, single},
    {"oru-replicationOnHold", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdReplMaxErrors", "int", "", -1, MAX, single},
    {"oru-slapdReplContextCacheSize", "int", "", 0, MAX, single},
    {"oru-slapdReplConflictMaxEntrySize", "int", "", 0, MAX, single},
    {"oru-slapdLog", "path", "", 1, 4096, single},
    {"oru-slapdLogSizeThreshold", "int", "", 0, MAX, single},
    {"oru-slapdLogMaxArchives", "int", "", -1, MAX, single},
    {"oru-slapdLogArchivePath", "path", "", 1, 4096, single},
    {"oru-slapdLogOptions", "ces", "", 0, 0, single},
    {"oru-slapdLogMgmtStartTime", "ces", "", 0, 0, single},
    {"oru-slapdLogMgmtFrequency", "enum", "enumFrequency", 0, 0, single},
    {"oru-slapdLogEventFileEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdLogEventFilePath", "path", "", 1, 4096, single},
    {"oru-slapdLogEventFilePrefix", "cis", "", 1, 4096, single},
    {"oru-slapdLogEventFileSizeThreshold", "int", "", 0, MAX, single},
    {"oru-slapdLogEventFileArchivePath", "path", "", 1, 4096, single},
    {"oru-slapdLogEventFileMaxArchives", "int", "", -1, MAX, single},
    {"oru-slapdLogEventFileOptions", "ces", "", 0, 0, single},
    {"oru-slapdLogEventFormat", "enum", "enumEventFmt", 0, 0, single},
    {"oru-slapdLogTALMEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdLogTALMServer", "url", "", 0, 0, single},
    {"oru-slapdLogTALMPort", "int", "", 1, 65535, single},
    {"oru-slapdLogTALMDiskCacheFile", "path", "", 1, 4096, single},
    {"oru-slapdLogTALMOptions", "ces", "", 0, 0, single},
    {"oru-slapdAuditOperation", "enum", "enumAuditOp", 0, 0, multi},
    {"oru-slapdCryptoSync", "ces", "", 0, 0, single},
    {"oru-slapdProxyDn", "ces", "", 0, 0, single},
    {"oru-slapdProxyBindMethod", "ces", "", 0, 0, single},
    {"oru-slapdProxyTargetUrl", "ces", "", 0, 0, single},
    {"oru-slapdProxyDigestUserName", "ces", "", 0, 0, single},
    {"oru-slapdProxyConnectionPoolSize", "int", "", 0, MAX, single},
    {"oru-slapdStatusInterval", "int", "", 0, MAX, single},
    {"oru-slapdProxyTier", "int", "", 1, 5, single},
    {"oru-slapdProxyPw", "pw", "", 1, 1024, single},
    {"oru-slapdProxyEnableDistDynamicGroups", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdProxyEnableDistGroups", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdProxySplitName", "cis", "", 0, 0, single},
    {"oru-slapdProxyBackendServerRole", "enum", "enumServerRole", 0, 0, single},
    {"oru-slapdNumRetry", "int", "", 0, MAX, single},
    {"oru-audit", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditAdd", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditAttributesOnGroupEvalOp", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditBind", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditPTABindInfo", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditCompare", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditDelete", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditExtOp", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditExtOpEvent", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditFailedOpOnly", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditGroupsOnGroupControl", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditModify", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditModifyDN", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditSearch", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditUnBind", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditPerformance", "enum", "enumBoolean", 0, 0, single},
    {"oru-auditVersion", "int", "", 1, 65535, single},
    {"oru-slapdCachedAttributeAutoAdjust", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdCachedAttributeAutoAdjustTime", "time", "", 7, 7, single},
    {"oru-slapdCachedAttributeAutoAdjustTimeInterval", "int", "", 1, 24, single},
    {"oru-slapdMigrationInfo", "cis", "", 0, 0, multi},
    {"oru-slapdGroupMembersCacheSize", "int", "", 0, MAX, single},
    {"oru-slapdGroupMembersCacheBypassLimit", "int", "", 0, MAX, single},
    {"oru-slapdUlimitVirtualMemory", "int", "", -1, MAX, single},
    {"oru-slapdUlimitRSS", "int", "", -1, MAX, single},
    {"oru-slapdUlimitDataSegment", "int", "", -1, MAX, single},
    {"oru-slapdUlimitStackSize", "int", "", -1, MAX, single},
    {"oru-slapdUlimitFileSize", "int", "", -1, MAX, single},
    {"oru-slapdUlimitNofile", "int", "", -1, MAX, single},
    {"oru-slapdUlimitDescription", "ces", "", 0, 0, single},
    {"oru-slapdReplRestrictedAccess", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdNoReplConflictResolution", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdPtaEnabled", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdPtaResultTimeout", "int", "", 0, 60000, single},
    {"oru-slapdPtaMigratePwd", "enum", "enumBoolean", 0, 0, single},
    {"oru-slapdPtaConnectionPoolSize", "int", "", 2, 15, single},
    {"oru-slapdPtaSubtree", "dn", "", 1, 0, multi},
    {"oru-slapdPtaURL", "url", "urlLdap", 0, 0, single},
    {"oru-slapdPtaBindDN", "ces", "", 0, 0, single},
    {"oru-slapdPtaBindPW", "pw", "", 1, 1024, single},
    {"oru-slapdPtaSearchBase", "dn", "", 1, 0, single},
    {"oru-slapdPtaAttrMapping", "ces", "", 3, 1024, single},
};

// The list of enumETStatCond runs on into that of enumServerRole.
const std::map<std::string, std::vector<std::string>> expected_words = {
    {"enumBoolean", {"true", "false"}},
    {"enumPwEncryption", {"none", "crypt", "sha", "ssha", "md5", "aes128", "aes192", "aes256"}},
    {"enumSchemaCheck", {"none", "V2", "V3", "V3_lenient"}},
    {"enumSecurity", {"none", "SSL", "SSLOnly", "TLS", "SSLTLS"}},
    {"enumSslAuth", {"ServerAuth", "ServerClientAuth"}},
    {"enumSysLogLevel", {"l", "m", "h"}},
    {"enumDerefAliases", {"never", "find", "search", "always"}},
    {"enumETStatCond", {"S", "T", "SOT", "SAT", "any", "primarywrite"}},
    {"enumServerRole", {"any", "primarywrite"}},
    {"enumAdminRole",
     {"AuditAdmin", "DirDataAdmin", "NoAdmin", "ReplicationAdmin", "SchemaAdmin",
      "ServerConfigGroupMember", "ServerStartStopAdmin", "PasswordAdmin"}},
    {"enumAcceleratorMode", {"none", "DIGEST", "SYMMETRIC", "RANDOM"}},
    {"enumFrequency",
     {"month", "15day", "week", "day", "12hr", "8hr", "6hr", "4hr", "3hr", "2hr", "hr", "45min",
      "30min", "15min", "5min", "min"}},
    {"enumEventFmt", {"CBE"}},
    {"enumAuditOp",
     {"ALL", "AUDITCONFIGMODIFYFROMMSG", "AUDITCONFIGMODIFY", "AUDITSTART", "AUDITSTOP", "BIND",
      "CLEARSERVERLOG", "PWDPOLICYCONFIGMODIFY", "REREADSERVERCONFIG", "SERVERCONFIGMODIFY",
      "SERVERSTART", "SERVERSTOP", "UNBIND", "USERPWDMODIFY", "USERPWDMODIFYBYANOTHER"}},
    {"urlLdap", {"ldap", "ldaps"}},
    {"oidACI", {"1.3.99.0.2.26.1", "1.3.99.0.2.26.2"}},
};

// --- the syntaxes ---------------------------------------------------------------------------

struct syntax {
    match_operation* match;
    from_str_operation* fromStr;
    from_bin_operation* fromBin;
    to_str_operation* toStr;
    to_bin_operation* toBin;
};

#define SYNTAX(family)                                                                      \
    {                                                                                       \
#family, {                                                                          \
            family##Compare, family##FromStr, family##FromBin, family##ToStr, family##ToBin \
        }                                                                                   \
    }

const std::map<std::string, syntax> syntaxes = {
    SYNTAX(ces),  SYNTAX(cis), SYNTAX(enum), SYNTAX(time), SYNTAX(int),   SYNTAX(kilo),
    SYNTAX(mask), SYNTAX(oid), SYNTAX(dn),   SYNTAX(dc),   SYNTAX(url),   SYNTAX(krbdn),
    SYNTAX(env),  SYNTAX(pw),  SYNTAX(path), SYNTAX(file), SYNTAX(plugin)};

#undef SYNTAX

bool has_expected_columns(const _AttrType& row, const expected_row& expected) {
    const std::string words = expected.words;
    const bool has_mask = words.starts_with("mask ");
    const syntax& family = syntaxes.at(expected.family);
    if (row.match != family.match || row.fromStr != family.fromStr ||
        row.fromBin != family.fromBin || row.toStr != family.toStr || row.toBin != family.toBin ||
        row.bitmask != (has_mask ? strtoll(words.c_str() + 5, nullptr, 16) : 0) ||
        row.minimum != expected.minimum || row.maximum != expected.maximum ||
        row.isSingle != expected.is_single) {
        return false;
    }
    if (words.empty() || has_mask) {
        return row.enumValues == nullptr;
    }
    std::vector<std::string> list;
    for (const char* const* word = row.enumValues; word && *word; ++word) {
        list.push_back(*word);
    }
    return list == expected_words.at(words);
}

/// The number of the first row that is not as expected in the stored order; -1 for none.
int first_wrong_stored_row() {
    int position = 0;
    for (const expected_row& expected : expected_rows) {
        const _AttrType& row = attrMapArray[position];
        if (!row.name || std::string(row.name) != expected.name ||
            !has_expected_columns(row, expected)) {
            return position;
        }
        ++position;
    }
    return attrMapArray[position].name ? position : -1;
}

/// Look-ups by eight threads, held back until all are there; true when every one is right.
bool race_first_look_up() {
    constexpr int threads = 8;
    std::atomic<int> arrived = 0;
    std::atomic<int> wrong = 0;
    std::vector<std::thread> racers;
    for (int i = 0; i < threads; ++i) {
        racers.emplace_back([&, i] {
            ++arrived;
            while (arrived < threads) {
            }
            const size_t count = std::size(expected_rows);
            for (size_t n = 0; n < count; ++n) {
                const expected_row& expected =
                    expected_rows[(n + static_cast<size_t>(i) * 25) % count];
                const _AttrType* row = getAttrType(expected.name);
                const bool right = row->name && strcasecmp(row->name, expected.name) == 0 &&
                                   has_expected_columns(*row, expected);
                wrong += right ? 0 : 1;
            }
            wrong += getAttrType("oru-slapdNoSuchThing")->name ? 1 : 0;
        });
    }
    for (std::thread& racer : racers) {
        racer.join();
    }
    return wrong == 0 && numAttrs == 197 && defaultAttrType == attrMapArray + 197;
}

/// Ends a process whose table must be untouched yet with 1 when it isn't, else with body's result.
template <class Body>
[[noreturn]] void exit_of_fresh_process(Body body) {
    if (defaultAttrType || numAttrs != 0) {
        fprintf(stderr, "the table is initialised already\n");
        _exit(1);
    }
    _exit(body() ? 0 : 2);
}

/// The bodies of these tests run in a process of their own, which starts from main().
class LDIF_AttrTypeDeathTest : public testing::Test {
  protected:
    LDIF_AttrTypeDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

}  // namespace

// --- the table ------------------------------------------------------------------------------

TEST_F(LDIF_AttrTypeDeathTest, TheTableIsStoredInItsOrderUntilTheFirstLookUp) {
    EXPECT_EXIT(exit_of_fresh_process([] {
                    const int wrong = first_wrong_stored_row();
                    fprintf(stderr, "wrong row: %d\n", wrong);
                    return wrong == -1;
                }),
                testing::ExitedWithCode(0), "");
}

TEST_F(LDIF_AttrTypeDeathTest, ANullNameCanBeTheFirstLookUp) {
    EXPECT_EXIT(exit_of_fresh_process(
                    [] { return getAttrType(nullptr) == attrMapArray + 197 && numAttrs == 197; }),
                testing::ExitedWithCode(0), "");
}

TEST_F(LDIF_AttrTypeDeathTest, ThreadsMayRaceForTheFirstLookUp) {
    for (int round = 0; round < 10; ++round) {
        EXPECT_EXIT(exit_of_fresh_process(race_first_look_up), testing::ExitedWithCode(0), "");
    }
}

TEST(LDIF_AttrType, EveryAttributeHasItsColumns) {
    for (const expected_row& expected : expected_rows) {
        SCOPED_TRACE(expected.name);
        const _AttrType* row = getAttrType(expected.name);
        ASSERT_NE(row, defaultAttrType);
        EXPECT_STREQ(row->name, expected.name);
        EXPECT_TRUE(has_expected_columns(*row, expected));
    }
}

TEST(LDIF_AttrType, TheTableIsSortedWithoutRegardToCase) {
    getAttrType(nullptr);
    ASSERT_EQ(numAttrs, 197);
    std::vector<std::string> names;
    for (int i = 0; i < numAttrs; ++i) {
        names.push_back(attrMap[i].name);
    }
    std::vector<std::string> expected;
    for (const expected_row& row : expected_rows) {
        expected.push_back(row.name);
    }
    const auto less = [](const std::string& left, const std::string& right) {
        return strcasecmp(left.c_str(), right.c_str()) < 0;
    };
    std::sort(expected.begin(), expected.end(), less);
    EXPECT_EQ(names, expected);
    const auto twice = std::adjacent_find(names.begin(), names.end());
    ASSERT_NE(twice, names.end());
    EXPECT_EQ(*twice, "oru-slapdIdleTimeOut");
}

TEST(LDIF_AttrType, TheRowWithoutNameTakesAnyTextAnyNumberOfTimes) {
    const _AttrType* row = getAttrType(nullptr);
    EXPECT_EQ(attrMap, attrMapArray);
    EXPECT_EQ(row, defaultAttrType);
    EXPECT_EQ(row, attrMap + 197);
    EXPECT_EQ(row->name, nullptr);
    EXPECT_TRUE(has_expected_columns(*row, {nullptr, "ces", "", 0, 0, multi}));
    const std::string text(100000, 'x');
    EXPECT_EQ(LDIF_Value(row, text, nullptr).str(), text);
}

TEST(LDIF_AttrType, NamesAreFoundInAnyCase) {
    for (const expected_row& expected : expected_rows) {
        SCOPED_TRACE(expected.name);
        std::string upper = expected.name;
        std::string lower = expected.name;
        std::transform(upper.begin(), upper.end(), upper.begin(), toupper);
        std::transform(lower.begin(), lower.end(), lower.begin(), tolower);
        for (const std::string& name : {upper, lower}) {
            const _AttrType* row = getAttrType(name.c_str());
            ASSERT_NE(row->name, nullptr);
            EXPECT_STREQ(row->name, expected.name);
        }
    }
    EXPECT_TRUE(
        has_expected_columns(*getAttrType("OBJECTCLASS"), {"objectclass", "cis", "", 0, 0, multi}));
    EXPECT_TRUE(has_expected_columns(*getAttrType("ORU-SLAPDIDLETIMEOUT"),
                                     {"", "int", "", 0, MAX, single}));
}

TEST(LDIF_AttrType, UnknownNamesGetTheDefaultRow) {
    for (const char* name :
         {"", "a", "charse", "charset2", "oru-slapdNoSuchThing", "oru-", "versio", "version ", "zz",
          " cn", "\xff", "oru-slapdSslCipherSpec5", "oru-slapdSslCipherSpe"}) {
        EXPECT_EQ(getAttrType(name), defaultAttrType) << name;
    }
}

TEST(LDIF_AttrType, TheMultiValuedAttributesAreTheTwelve) {
    getAttrType(nullptr);
    std::set<std::string> names;
    for (int i = 0; i < numAttrs; ++i) {
        if (!attrMap[i].isSingle) {
            names.insert(attrMap[i].name);
        }
    }
    EXPECT_EQ(names,
              (std::set<std::string>{
                  "objectclass", "oru-slapdAdminRole", "oru-slapdIncludeSchema", "oru-slapdPlugin",
                  "oru-slapdReferral", "oru-slapdSslPKCS11AcceleratorMode", "oru-slapdSetenv",
                  "oru-slapdSuffix", "oru-slapdCachedAttribute", "oru-slapdAuditOperation",
                  "oru-slapdMigrationInfo", "oru-slapdPtaSubtree"}));
}

TEST(LDIF_AttrType, TheSearchStaysInsideItsRange) {
    getAttrType(nullptr);
    EXPECT_STREQ(searchAttrMap("CHARSET", 0, 197)->name, "charset");
    EXPECT_STREQ(searchAttrMap("Version", 0, 197)->name, "version");
    EXPECT_STREQ(attrMap[0].name, "charset");
    EXPECT_STREQ(attrMap[196].name, "version");
    EXPECT_EQ(searchAttrMap("charset", 1, 197), nullptr);
    EXPECT_EQ(searchAttrMap("version", 0, 196), nullptr);
    EXPECT_EQ(searchAttrMap("aaa", 0, 197), nullptr);
    EXPECT_EQ(searchAttrMap("zzz", 0, 197), nullptr);
    EXPECT_EQ(searchAttrMap("", 0, 197), nullptr);
    EXPECT_EQ(searchAttrMap("charset", 0, 0), nullptr);
    EXPECT_EQ(searchAttrMap("charset", 5, 2), nullptr);
    for (int i = 0; i < numAttrs; ++i) {
        const _AttrType* alone = searchAttrMap(attrMap[i].name, i, i + 1);
        EXPECT_EQ(alone, attrMap + i);
    }
}

TEST(LDIF_AttrType, InitialisingAgainChangesNothing) {
    getAttrType(nullptr);
    std::vector<const char*> before;
    for (int i = 0; i < numAttrs; ++i) {
        before.push_back(attrMap[i].name);
    }
    initAttrMap();
    EXPECT_EQ(numAttrs, 197);
    EXPECT_EQ(defaultAttrType, attrMap + 197);
    for (int i = 0; i < numAttrs; ++i) {
        EXPECT_STREQ(attrMap[i].name, before[static_cast<size_t>(i)]);
    }
}

TEST(LDIF_AttrType, RowsCompareByNameWithoutRegardToCase) {
    const _AttrType& cn = *getAttrType("cn");
    EXPECT_EQ(cn.compare("CN"), 0);
    EXPECT_LT(cn.compare("D"), 0);
    EXPECT_GT(cn.compare("B"), 0);
    EXPECT_LT(cn.compare("cn2"), 0);
    EXPECT_TRUE(cn < *getAttrType("version"));
    EXPECT_FALSE(*getAttrType("version") < cn);
    EXPECT_FALSE(cn < cn);
}

TEST(LDIF_AttrType, LookingUpAllocatesNothing) {
    getAttrType(nullptr);
    const failing_allocation counting(std::numeric_limits<long>::max());
    for (const expected_row& expected : expected_rows) {
        getAttrType(expected.name);
    }
    getAttrType("oru-slapdNoSuchThing");
    EXPECT_EQ(failing_allocation::count(), 0);
}

TEST(LDIF_AttrType, ANameEndsAtItsNul) {
    EXPECT_EQ(cfg32::attribute_name(std::string_view("cn\0x", 4)).type(), getAttrType("cn"));
    EXPECT_EQ(cfg32::attribute_name(std::string_view("c\0n", 3)).type(), getAttrType("c"));
}
