#include "configuration.h"

#include <gmock/gmock.h>

#include "cfg32.h"

namespace cfg32::tool {

TEST(Configuration, OfAnEntryAFilterFindsWhatIsThere) {
    const configuration file({}, "conf",
                             "dn: cn=Configuration\nz: 1\ncn: Configuration\nZ: 2\na: x\nz: 1\n"
                             "oru-slapdAdminPW: {SHA}x\nobjectclass: top\n\n"
                             "dn: cn=A, cn=Configuration\nb: 2\nB: 1\n\n"
                             "dn: cn=none, cn=Configuration\n\n");
    const auto described = [](const std::vector<entry>& entries) {
        std::string text;
        for (const entry& each : entries) {
            text += each.dn + "\n";
            for (const attribute& one : each.attributes) {
                text += " " + one.name + testing::PrintToString(one.values) + "\n";
            }
        }
        return text;
    };
    const auto found = [&](const char* filter) {
        return described(file.search("cn=Configuration", CFG_SCOPE_SUBTREE, filter));
    };
    EXPECT_EQ(found("cn=*"), described({entry_of(file.entry_at("cn=Configuration"))}));
    EXPECT_EQ(found("cn=*"),
              "cn=Configuration\n a{ \"x\" }\n cn{ \"Configuration\" }\n objectclass{ \"top\" }\n"
              " oru-slapdAdminPW{ \"{SHA}x\" }\n z{ \"1\", \"2\" }\n");
    EXPECT_EQ(found("b=1"), "cn=A, cn=Configuration\n b{ \"2\", \"1\" }\n");
}

}  // namespace cfg32::tool
