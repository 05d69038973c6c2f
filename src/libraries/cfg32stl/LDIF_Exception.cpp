#include "LDIF_Exception.h"

#include <cstring>
#include <ostream>
#include <typeinfo>
#include <utility>

#include "LDIF_AttrType.h"
#include "cfg32.h"
#include "cfg32_platform.h"
#include "failure.h"

std::atomic<bool> LDIF_Exception::showStack = true;
std::atomic<bool> LDIF_Exception::showSource = false;

LDIF_Exception::LDIF_Exception(const char* file, int line, int ldapErr, int extErr, const char* msg)
    : srcFile(file), srcLine(line), msg(msg), ldapErr(ldapErr), extErr(extErr) {}

LDIF_Exception::LDIF_Exception(const LDIF_Exception& e, std::unique_ptr<LDIF_Exception> cause)
    : std::exception(e),
      srcFile(e.srcFile),
      srcLine(e.srcLine),
      msg(e.msg),
      ldapErr(e.ldapErr),
      extErr(e.extErr),
      sysErrno(e.sysErrno),
      sysErrnoKind(e.sysErrnoKind),
      configFile(e.configFile),
      configLine(e.configLine),
      entryDn(e.entryDn),
      attribute(e.attribute),
      value(e.value),
      attrType(e.attrType),
      cause(std::move(cause)) {}

LDIF_Exception::LDIF_Exception(const LDIF_Exception& e) : LDIF_Exception(e, nullptr) {
    LDIF_Exception* last = this;
    for (const LDIF_Exception* next = e.cause.get(); next; next = next->cause.get()) {
        last->cause.reset(new LDIF_Exception(*next, nullptr));
        last = last->cause.get();
    }
}

LDIF_Exception::~LDIF_Exception() {
    while (cause) {
        cause = std::move(cause->cause);
    }
}

LDIF_Exception::LDIF_Exception(const char* file, int line, const LDIF_Exception& e)
    : LDIF_Exception(file, line, LDIF_Exception(e)) {}

LDIF_Exception::LDIF_Exception(const char* file, int line, LDIF_Exception&& e)
    : LDIF_Exception(e, nullptr) {
    srcFile = file;
    srcLine = line;
    cause = std::make_unique<LDIF_Exception>(std::move(e));
}

namespace {

/// A number in decimal, through the server's bounded formatting routine. KEPT: a number of more
/// than 15 characters is cut there; cfg_get_minimum() and cfg_get_maximum() give it whole.
std::string decimal(const char* format, long number) {
    char buffer[16];
    nuv_snprintf(buffer, sizeof buffer, format, number);
    return buffer;
}

std::string decimal(int number) { return decimal("%ld", number); }

std::string joined_words(const char* const* words) {
    std::string text;
    for (const char* const* word = words; *word; ++word) {
        text.append(word == words ? "" : ", ").append(*word);
    }
    return text;
}

std::string constraints(const _AttrType& type) {
    std::string text = "\nConstraints for ";
    text += type.name ? type.name : "UNKNOWN ATTRIBUTE TYPE";
    text += type.isSingle ? "\n  Single-valued" : "\n  Multi-valued";
    if (type.minimum != 0 || type.maximum != 0) {
        text += "\n  min: " + decimal("%ld", type.minimum);
        text += "\n  max: " + decimal("%ld", type.maximum);
    }
    if (type.bitmask != 0) {
        // KEPT: the digits are left out; readers of these reports know the line in this form.
        text += "\n  bit mask: 0x";
    }
    if (type.enumValues) {
        text += "\n  enumeration: { " + joined_words(type.enumValues) + " }";
    }
    return text;
}

/// One line of a report, left out when there is nothing to say.
void append_line(std::string& report, const char* label, const std::string& text) {
    if (!text.empty()) {
        report.append("\n").append(label).append(text);
    }
}

std::string code_line(const char* label, int code) {
    return std::string("\n") + label + decimal(code) + ": " + cfg_err2string(code);
}

std::string place_in_file(const std::string& file, int line) {
    if (file.empty()) {
        return {};
    }
    return line != 0 ? "\nLine " + decimal(line) + " of " + file : "\nConfig file: " + file;
}

}  // namespace

/// Calls own(cause) for each cause that is shown, and whole(cause) for one of another class, which
/// reports its causes itself. It does not recurse: a chain may be deeper than a stack.
template <class Own, class Whole>
void LDIF_Exception::for_each_cause(Own own, Whole whole) const {
    for (const LDIF_Exception* e = cause.get(); e && showStack; e = e->cause.get()) {
        if (typeid(*e) != typeid(LDIF_Exception)) {
            return whole(*e);
        }
        own(*e);
    }
}

void LDIF_Exception::append_dump(std::string& report) const {
    report += "[" + srcFile + ":" + decimal(srcLine);
    // KEPT: without a message the bracket stays open; tools that read the reports expect it so.
    append_line(report += msg.empty() ? "" : "]", "msg     ", msg);
    if (sysErrno != 0 && sysErrnoKind == 0) {
        report += "\nerrno " + decimal(sysErrno) + ": " + strerror(sysErrno);
    }
    report += code_line("ldapErr ", ldapErr);
    if (extErr > 0 && extErr != ldapErr) {
        report += code_line("extErr ", extErr);
    }
    report += place_in_file(configFile, configLine);
    append_line(report, "entry dn: ", entryDn);
    append_line(report, "attribute: ", attribute);
    append_line(report, "value: ", value);
    if (attrType) {
        report += constraints(*attrType);
    }
    report += "\n";
}

std::string LDIF_Exception::dump() const {
    std::string report;
    append_dump(report);
    for_each_cause([&](const LDIF_Exception& e) { e.append_dump(report += "\n"); },
                   [&](const LDIF_Exception& e) { report.append("\n").append(e.dump()); });
    return report;
}

void LDIF_Exception::append_str(std::string& report) const {
    if (showSource) {
        report += "[" + fileStr() + "] ";
    }
    if (sysErrno != 0) {
        report += errStr() + ": ";
    }
    if (!msg.empty()) {
        report += msgStr() + "\n";
    }
}

std::string LDIF_Exception::str() const {
    std::string report;
    append_str(report);
    for_each_cause([&](const LDIF_Exception& e) { e.append_str(report); },
                   [&](const LDIF_Exception& e) { report += e.str(); });
    return report;
}

std::string LDIF_Exception::fileStr() const {
    if (srcFile.empty()) {
        return "file?";
    }
    const size_t folder = srcFile.find_last_of("/\\");
    const std::string base = folder == std::string::npos ? srcFile : srcFile.substr(folder + 1);
    return base + ":" + decimal(srcLine);
}

std::string LDIF_Exception::errStr() const { return decimal(sysErrno); }

std::string LDIF_Exception::msgStr() const { return msg; }

std::ostream& operator<<(std::ostream& out, const LDIF_Exception& e) { return out << e.str(); }

namespace cfg32 {

std::string throw_site::source() const {
    const char* slash = strrchr(path, '/');
    const char* base = slash ? slash + 1 : path;
    return "src/libraries/cfg32stl/" + std::string(base, strcspn(base, "."));
}

LDIF_Exception make_exception(const failure& kind, const std::string& detail,
                              const throw_site& site) {
    return LDIF_Exception(site.source().c_str(), site.line, kind.ldap, kind.ext,
                          (kind.text + detail).c_str());
}

void raise(const failure& kind, const std::string& detail, const throw_site& site) {
    throw make_exception(kind, detail, site);
}

}  // namespace cfg32
