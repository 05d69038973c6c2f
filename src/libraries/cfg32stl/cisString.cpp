#include "cisString.h"

#include <strings.h>

#include "LDIF_Util.h"

cisString& cisString::append(const std::wstring& text, size_t pos, size_t count) {
    text_ += wide2multibyte(text.substr(pos, count));
    return *this;
}

int cisString::compare(const char* other) const { return strcasecmp(text_.c_str(), other); }

int cisString::compare(const std::string& other) const { return compare(other.c_str()); }

int cisString::compare(const cisString& other) const { return compare(other.text_.c_str()); }
