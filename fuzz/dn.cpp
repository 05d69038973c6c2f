#include <algorithm>
#include <optional>
#include <utility>

#include "LDIF_DN.h"
#include "LDIF_Exception.h"
#include "dn_path.h"
#include "exempt_dn.h"
#include "order.h"

namespace cfg32::fuzz {

namespace {

/// A DN and the text that it was read from.
struct read_dn {
    std::string text;
    LDIF_DN dn;
};

std::vector<read_dn> read_dns(std::string_view input) {
    std::vector<read_dn> dns;
    for (std::string& text : parts_of(input, 4)) {
        try {
            LDIF_DN dn{cisString(text)};
            dns.push_back({std::move(text), std::move(dn)});
        } catch (const LDIF_Exception& e) {
            require(e.ldapErr == 34 || e.ldapErr == 162,
                    "a refused DN is one for its syntax or its bytes");
        }
    }
    return dns;
}

template <class Is>
bool has_value_that(const LDIF_DN& dn, Is is) {
    return std::any_of(dn.rdns().begin(), dn.rdns().end(), [&](const LDIF_RDN& rdn) {
        return std::any_of(rdn.pairs().begin(), rdn.pairs().end(),
                           [&](const LDIF_RDN_pair& pair) { return is(pair.value); });
    });
}

bool has_empty_value(const LDIF_DN& dn) {
    return has_value_that(dn, [](const LDIF_RDN_value& value) { return value.empty(); });
}

/// A comparison ends at it.
bool has_zero_byte(const LDIF_DN& dn) {
    return has_value_that(dn, [](const LDIF_RDN_value& value) {
        return value.text().find('\0') != std::string::npos;
    });
}

/// The printed form; none of a DN that has none.
std::optional<std::string> printed_form(const LDIF_DN& dn) {
    try {
        std::string printed = dn.str();
        require(!has_empty_value(dn), "an empty value is not printed");
        return printed;
    } catch (const LDIF_Exception& e) {
        require(e.ldapErr == 34 && e.extErr == 1013 && has_empty_value(dn),
                "only an empty value can't be printed");
        return {};
    }
}

void require_print(const LDIF_DN& dn) {
    const std::optional<std::string> form = printed_form(dn);
    if (!form) {
        return;
    }
    const std::string& printed = *form;
    const LDIF_DN again{cisString(printed)};
    if (is_read_differently(dn)) {
        require(again != dn || has_zero_byte(dn), "only DNs are exempt that do not read back");
        return;
    }
    require_equal(again, dn, "a DN reads back as it is printed");
    require_equal(again.str(), printed, "a DN is printed alike again");
}

/// A tree keeps DNs in two ways, which are to tell the same.
void require_path(const read_dn& a, const read_dn& b) {
    const dn_path a_of_text{std::string_view(a.text)};
    const dn_path b_of_text{std::string_view(b.text)};
    const dn_path b_of_dn(b.dn);
    const int order = a.dn.compare(b.dn);
    require_equal(a_of_text.size(), a.dn.rdns().size(), "a path has the RDNs of its DN");
    require_equal(sign(a_of_text.compare(b_of_text)), sign(order), "paths have their DNs' order");
    require_equal(sign(a_of_text.compare(b_of_dn)), sign(order), "paths of any kind have it");
    if (order == 0) {
        require_equal(a.dn.hash(), b.dn.hash(), "equal DNs have equal hashes");
        for (size_t i = 0; i < a_of_text.size(); ++i) {
            require_equal(a_of_text.hash(i, 0), b_of_dn.hash(i, 0),
                          "equal RDNs of paths have equal hashes");
        }
    }
}

void require_kept(const read_dn& read) {
    const kept_dn kept{given_text(read.text)};
    require(kept.dn() == read.dn, "a DN is kept as it is read");
    if (const std::optional<std::string> expected = printed_form(read.dn)) {
        std::string printed;
        kept.append_to(printed);
        require_equal(printed, *expected, "a kept DN is printed as it is");
    }
}

void require_arithmetic(const LDIF_DN& a, const LDIF_DN& b) {
    const LDIF_DN common = a.intersection(b);
    require(common == b.intersection(a), "an intersection is that from both sides");
    require(common.intersection(a) == common, "an intersection is common to both");
    LDIF_DN rest = a;
    rest -= b;
    require_equal(rest.rdns().size() + common.rdns().size(), a.rdns().size(),
                  "what is left is what is not common");
    LDIF_DN whole = common;
    for (const LDIF_RDN& rdn : rest.rdns()) {
        whole += rdn;
    }
    require(whole == a, "what is common and what is left make the whole");
    if (common == b && common != a) {
        require(a < b, "an ancestor is greater than its descendants");
    }
}

}  // namespace

void dn_property(std::string_view input) {
    const std::vector<read_dn> dns = read_dns(input);
    for (const read_dn& each : dns) {
        require_print(each.dn);
        require_kept(each);
        for (const read_dn& other : dns) {
            require_path(each, other);
            require_arithmetic(each.dn, other.dn);
        }
    }
    require_order(dns, [](const read_dn& a, const read_dn& b) { return a.dn.compare(b.dn); });
}

}  // namespace cfg32::fuzz
