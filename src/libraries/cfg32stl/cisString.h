#pragma once

#include <string>

/// A string that is compared without regard to case, with strcasecmp (POSIX): the names of
/// attributes, entries and the parts of a DN. The text keeps its spelling.
///
/// The operators call the virtual compare of the same overload, so a derived class that overrides
/// compare changes all of them.
class cisString {
  public:
    cisString() = default;
    cisString(const char* text) : text_(text) {}
    cisString(const std::string& text) : text_(text) {}
    cisString(std::string&& text) noexcept : text_(std::move(text)) {}
    cisString(const cisString&) = default;
    cisString(cisString&&) noexcept = default;
    cisString& operator=(const cisString&) = default;
    cisString& operator=(cisString&&) noexcept = default;
    virtual ~cisString() = default;

    /// Appends count wide characters of text from pos on, converted (LDIF_Exception 163/163).
    virtual cisString& append(const std::wstring& text, size_t pos, size_t count);

    /// Negative, zero or positive, as this text sorts before, with or after the other.
    virtual int compare(const char* other) const;
    virtual int compare(const std::string& other) const;
    virtual int compare(const cisString& other) const;

    virtual bool operator==(const char* other) const { return compare(other) == 0; }
    virtual bool operator==(const std::string& other) const { return compare(other) == 0; }
    virtual bool operator==(const cisString& other) const { return compare(other) == 0; }
    virtual bool operator<(const char* other) const { return compare(other) < 0; }
    virtual bool operator<(const std::string& other) const { return compare(other) < 0; }
    virtual bool operator<(const cisString& other) const { return compare(other) < 0; }
    virtual bool operator>(const char* other) const { return compare(other) > 0; }
    virtual bool operator>(const std::string& other) const { return compare(other) > 0; }
    virtual bool operator>(const cisString& other) const { return compare(other) > 0; }
    virtual bool operator!=(const char* other) const { return compare(other) != 0; }
    virtual bool operator!=(const std::string& other) const { return compare(other) != 0; }
    virtual bool operator!=(const cisString& other) const { return compare(other) != 0; }
    virtual bool operator<=(const char* other) const { return compare(other) < 1; }
    virtual bool operator<=(const std::string& other) const { return compare(other) < 1; }
    virtual bool operator<=(const cisString& other) const { return compare(other) < 1; }
    virtual bool operator>=(const char* other) const { return compare(other) >= 0; }
    virtual bool operator>=(const std::string& other) const { return compare(other) >= 0; }
    virtual bool operator>=(const cisString& other) const { return compare(other) >= 0; }

    /// The text as it was given.
    const std::string& text() const { return text_; }
    const char* c_str() const { return text_.c_str(); }
    bool empty() const { return text_.empty(); }

  protected:
    std::string text_;
};
