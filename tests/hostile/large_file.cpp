#include "large_file.h"

#include <algorithm>

#include "environment.h"

namespace cfg32::tests {

namespace {

const std::string configuration = "cn=Configuration";
const std::string subject_dn = "cn=Subject, cn=Configuration";
const std::string subject_head = "\ndn: " + subject_dn + "\ncn: Subject\n";

std::string usual_subject(size_t) { return subject_dn; }
size_t none(size_t) { return 0; }
size_t one(size_t) { return 1; }
size_t two(size_t) { return 2; }
size_t each(size_t count) { return count; }
size_t two_each_but_one(size_t count) { return 2 * count - 1; }
size_t head_and_each(size_t count) { return count + 1; }
size_t head_and_two_each(size_t count) { return 2 * count + 1; }

/// Writes a long text in pieces.
void repeat(std::ostream& out, const std::string& piece, size_t size) {
    for (; size >= piece.size(); size -= piece.size()) {
        out << piece;
    }
    out << piece.substr(0, size);
}

void comment_bytes(std::ostream& out, size_t count) {
    out << subject_head;
    repeat(out, "# " + std::string(77, 'c') + "\n", count / 80 * 80);
}

void one_comment(std::ostream& out, size_t count) {
    out << subject_head << "# ";
    repeat(out, std::string(1000, 'c'), count);
    out << "\nnote: n\n";
}

void one_value(std::ostream& out, size_t count) {
    out << subject_head << "note: ";
    repeat(out, std::string(1000, 'v'), count);
    out << "\n";
}

void one_line_without_colon(std::ostream& out, size_t count) {
    out << subject_head;
    repeat(out, std::string(1000, 'l'), count);
    out << "\n";
}

void continuation_lines(std::ostream& out, size_t count) {
    out << subject_head << "note: v\n";
    repeat(out, " v\n", 3 * count);
}

void comment_lines(std::ostream& out, size_t count) {
    out << subject_head;
    repeat(out, "#\n", 2 * count);
    out << "note: n\n";
}

void invalid_lines(std::ostream& out, size_t count) {
    out << subject_head;
    for (size_t i = 0; i < count; ++i) {
        out << "line " << i << "\n";
    }
}

void attribute_names(std::ostream& out, size_t count) {
    out << subject_head;
    for (size_t i = count; i > 0; --i) {
        out << "name" << i << ": n\n";
    }
}

void values(std::ostream& out, size_t count) {
    out << subject_head;
    for (size_t i = 0; i < count; ++i) {
        out << "list: " << i << "\n";
    }
}

void entries(std::ostream& out, size_t count) {
    for (size_t i = 1; i < count; ++i) {
        out << "\ndn: cn=" << i << ", " << configuration << "\ncn: " << i << "\n";
    }
    out << subject_head;
}

void same_entries(std::ostream& out, size_t count) {
    for (size_t i = 0; i < count; ++i) {
        out << subject_head << "list: " << i << "\n";
    }
}

std::string deepest_dn(size_t count) {
    std::string dn;
    for (size_t i = count; i > 0; --i) {
        dn += "cn=" + std::to_string(i) + ", ";
    }
    return dn + configuration;
}

/// The text of a DN is the end of the one below it.
void tree(std::ostream& out, size_t count) {
    const std::string deepest = deepest_dn(count);
    size_t begin = deepest.size() - configuration.size();
    for (size_t i = 1; i <= count; ++i) {
        const std::string number = std::to_string(i);
        begin -= 3 + number.size() + 2;
        out << "\ndn: ";
        out.write(deepest.data() + begin, static_cast<std::streamsize>(deepest.size() - begin));
        out << "\ncn: " << number << "\n";
    }
}

/// Entries below a chain of ancestors that come after them, from the root down.
void late_ancestors(std::ostream& out, size_t count) {
    const std::string deepest = deepest_dn(count);
    for (size_t i = 1; i <= count; ++i) {
        out << "\ndn: cn=leaf" << i << ", " << deepest << "\ncn: leaf" << i << "\n";
    }
    tree(out, count);
}

std::string wide_dn(size_t count) {
    std::string dn = "a1=1";
    for (size_t i = 2; i <= count; ++i) {
        dn += "+a" + std::to_string(i) + "=" + std::to_string(i);
    }
    return dn + ", " + configuration;
}

void wide_rdn(std::ostream& out, size_t count) { out << "\ndn: " << wide_dn(count) << "\ncn: 1\n"; }

}  // namespace

const std::vector<large_file>& large_files() {
    constexpr size_t MB = 1'000'000;
    constexpr size_t GiB = 1 << 30;
    static const std::vector<large_file> all = {
        {"FileOfComments", 8 * MB, GiB, comment_bytes, usual_subject, two, none, 4},
        {"CommentOfOneLine", 4 * MB, 100 * MB, one_comment, usual_subject, two, one, 4},
        {"ValueOfOneLine", 4 * MB, 100 * MB, one_value, usual_subject, two, one, 4},
        {"LineWithoutColon", 4 * MB, 100 * MB, one_line_without_colon, usual_subject, two, one, 7},
        {"ContinuationLines", 400'000, MB, continuation_lines, usual_subject, two, one, 4},
        {"CommentLines", 400'000, MB, comment_lines, usual_subject, two, one, 4},
        {"InvalidLines", 10'000, 100'000, invalid_lines, usual_subject, two, each, 48},
        {"AttributeNames", 10'000, 100'000, attribute_names, usual_subject, two, each, 40},
        {"Values", 10'000, 100'000, values, usual_subject, two, each, 32},
        {"Entries", 10'000, MB, entries, usual_subject, head_and_each, none, 24},
        {"EntriesOfOneName", 10'000, 100'000, same_entries, usual_subject, two, two_each_but_one,
         10},
        {"DeepTree", 300, 10'000, tree, deepest_dn, head_and_each, none, 5},
        {"LateAncestors", 100, 1'000, late_ancestors, deepest_dn, head_and_two_each, none, 14},
        {"WideName", 10'000, 10'000, wide_rdn, wide_dn, two, one, 48},
    };
    return all;
}

size_t count_of(const large_file& one) {
    const size_t percent = number_from_environment("CFG32_HOSTILE_SCALE", 0);
    return std::max(one.usual, one.real / 100 * percent);
}

void write_large_file(const large_file& one, size_t count, std::ostream& out) {
    out << "charset: UTF-8\nversion: 1\n\ndn: cn=Configuration\ncn: Configuration\n"
           "objectclass: top\n";
    one.write_to(out, count);
}

}  // namespace cfg32::tests
