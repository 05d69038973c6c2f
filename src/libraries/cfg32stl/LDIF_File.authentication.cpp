// The administrator's login.

#include "LDIF_File.h"
#include "failure.h"

using namespace cfg32;

namespace {

constexpr int method_none = 0;       // LDAP_AUTH_NONE (RFC 1823)
constexpr int method_simple = 0x80;  // LDAP_AUTH_SIMPLE

const cisString configuration_dn = "cn=Configuration";
const cisString admin_dn = "oru-slapdAdminDN";
const cisString admin_password = "oru-slapdAdminPW";

}  // namespace

int LDIF_File::setAuthentication(const char* dn, const char* password, int method) {
    const auto body = [&] { return authenticate(dn, password, method); };
    const auto in_context = [&] {
        return with_context(body, [&](LDIF_Exception& e) {
            name_file(e);
            if (e.entryDn.empty()) {
                e.entryDn = configuration_dn.text();
            }
        });
    };
    return authentication_ = with_system_error(in("LDIF_File::setAuthentication()"), in_context,
                                               [&](LDIF_Exception& e) { name_file(e); });
}

int LDIF_File::authenticate(const char* dn, const char* password, int method) const {
    if (method == method_none) {
        return anonymous;
    }
    if (method != method_simple) {
        return not_authenticated;
    }
    if (!dn && !password) {
        return anonymous;
    }
    if (!dn || !password || *dn == '\0' || *password == '\0') {
        return not_authenticated;
    }
    const LDIF_Search_Results found = search(LDIF_DN(configuration_dn), LDIF_Search_Results::Base,
                                             LDIF_Filter(), {admin_dn, admin_password}, false);
    if (found.entries().empty()) {
        return not_authenticated;
    }
    const LDIF_Attributes& attributes = found.entries().front().attributes();
    const auto name = attributes.find(admin_dn);
    if (name != attributes.end() && !name->values().empty() &&
        name->values().begin()->compare(std::string(dn)) != 0) {
        return not_authenticated;
    }
    const auto secret = attributes.find(admin_password);
    if (secret == attributes.end()) {
        return not_authenticated;
    }
    // KEPT: an entry with an empty password list accepts any password.
    const LDIF_Values& secrets = secret->values();
    const bool is_accepted =
        secrets.empty() || secrets.begin()->compare(std::string(password)) == 0;
    return is_accepted ? administrator : not_authenticated;
}
