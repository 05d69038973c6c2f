#pragma once

#include <atomic>
#include <exception>
#include <iosfwd>
#include <memory>
#include <string>

struct _AttrType;

/// The library's one failure type. It names the place in the source and, as far as the throwing
/// layers knew them, the place in the configuration file and the constraint that was violated.
///
/// A layer that can add to a passing exception throws a new one that keeps the caught one as its
/// cause, so that a report shows the whole way of a failure (see failure.h).
class LDIF_Exception : public std::exception {
  public:
    std::string srcFile;     ///< source file of the throw, as the thrower gives it
    int srcLine = 0;         ///< line in srcFile
    std::string msg;         ///< may be empty
    int ldapErr = 0;         ///< LDAP result code (RFC 4511, 4.1.9; RFC 1823 for 81 and up)
    int extErr = 0;          ///< code of cfg_errlist, or ldapErr when there is nothing finer
    int sysErrno = 0;        ///< errno at the throw, 0 if none
    int sysErrnoKind = 0;    ///< 0: sysErrno is an error number of the C library
    std::string configFile;  ///< configuration file concerned
    int configLine = 0;      ///< line in configFile, 0 if unknown
    std::string entryDn;     ///< entry concerned
    std::string attribute;   ///< name of the attribute concerned
    std::string value;       ///< text of the value concerned
    const _AttrType* attrType = nullptr;    ///< type whose constraints were violated; not owned
    std::unique_ptr<LDIF_Exception> cause;  ///< the exception that this one completes

    /// Neither text may be null.
    LDIF_Exception(const char* file, int line, int ldapErr, int extErr, const char* msg);
    /// Copies the causes, too: two exceptions never share one.
    LDIF_Exception(const LDIF_Exception& e);
    /// Chains: everything but the source position is e's, and a copy of e is the cause.
    LDIF_Exception(const char* file, int line, const LDIF_Exception& e);
    /// The same; e itself becomes the cause, without a copy.
    LDIF_Exception(const char* file, int line, LDIF_Exception&& e);
    LDIF_Exception(LDIF_Exception&& e) = default;
    LDIF_Exception& operator=(const LDIF_Exception&) = delete;
    ~LDIF_Exception() override;

    /// Report of several lines, causes included when showStack is set.
    virtual std::string dump() const;
    /// Report of one line for each exception of the chain.
    virtual std::string str() const;
    /// "file:line" of the throw, without the folders.
    virtual std::string fileStr() const;
    /// sysErrno as a decimal number.
    virtual std::string errStr() const;
    virtual std::string msgStr() const;

    // Process-wide, set through the handle options CFG_OPT_SHOW_STACK and CFG_OPT_SHOW_SOURCE.
    static std::atomic<bool> showStack;   ///< reports show the causes
    static std::atomic<bool> showSource;  ///< str() begins with the source position

  private:
    /// e with another cause.
    LDIF_Exception(const LDIF_Exception& e, std::unique_ptr<LDIF_Exception> cause);

    template <class Own, class Whole>
    void for_each_cause(Own own, Whole whole) const;
    void append_dump(std::string& report) const;
    void append_str(std::string& report) const;
};

std::ostream& operator<<(std::ostream& out, const LDIF_Exception& e);
