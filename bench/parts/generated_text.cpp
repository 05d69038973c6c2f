#include "generated_text.h"

namespace cfg32::bench {

namespace {

constexpr size_t fan_out = 10;

std::string name_of(size_t number) {
    const std::string digits = std::to_string(number);
    return "Backend " + std::string(6 - digits.size(), '0') + digits;
}

std::string entry_text(size_t number, shape how) {
    const std::string name = name_of(number);
    std::string text =
        number % 3 == 0 ? "# Changed by the installer; see the operations manual.\n" : "";
    text += "dn: " + dn_of(number, how) + "\ncn: " + name + "\nobjectclass: top\n";
    text += "objectclass: oruConfigBackend\noru-slapdPort: " + std::to_string(number % 65535 + 1);
    text += "\noru-slapdSuffix: ou=" + name + ", dc=example, dc=com\n";
    text += number % 5 == 0
                ? "nuv-instanceDesc: serves the office of the town that\n  is called so\n"
                : "nuv-instanceDesc: serves the office\n";
    text += "oru-slapdReadOnly: false\noru-slapdPlugin: database libback-rdbm.so rdbm_init\n";
    return text + "\n";
}

}  // namespace

std::string dn_of(size_t number, shape how) {
    std::string dn = "cn=" + name_of(number);
    while (how == shape::nested && number >= fan_out) {
        number = number / fan_out - 1;
        dn += ", cn=" + name_of(number);
    }
    return dn + ", cn=Configuration";
}

std::string configuration_text(size_t entries, shape how) {
    std::string text =
        "version: 1\ncharset: UTF-8\n\ndn: cn=Configuration\ncn: Configuration\n"
        "objectclass: top\noru-slapdAdminDN: cn=root\noru-slapdAdminPW: secret\n\n";
    for (size_t i = 0; i < entries; ++i) {
        text += entry_text(i, how);
    }
    return text;
}

}  // namespace cfg32::bench
