// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The words of a JSON text: blanks, punctuation, strings and numbers.
#pragma once

#include <json/value.h>

#include <cstddef>
#include <string>
#include <string_view>

namespace vorn {

// Goes through a text that ends with a zero, which is nowhere allowed. Where a function returns
// false, something stands there that it does not take, or that releases of jsoncpp read
// differently.
class JsonScanner {
public:
    explicit JsonScanner(const char* szText) : szAt_(szText) {}

    const char* at() const { return szAt_; }
    void goTo(const char* szAt) { szAt_ = szAt; }

    void skipBlanks()
    {
        while (' ' == *szAt_ || '\t' == *szAt_ || '\n' == *szAt_ || '\r' == *szAt_) ++szAt_;
    }

    bool skip(char c)
    {
        if (c != *szAt_) return false;
        ++szAt_;
        return true;
    }

    bool skip(std::string_view strWord);

    // What the quotes enclose; it is valid until the next string is read.
    bool readString(std::string_view& strText)
    {
        if (!skip('"')) return false;
        const char* const szBegin = szAt_;
        skipPlain();
        if ('\\' == *szAt_) return readEscapedString(szBegin, strText);
        strText = {szBegin, static_cast<std::size_t>(szAt_ - szBegin)};
        return skip('"');
    }

    // Into a value of which only the payload changes.
    bool readNumber(Json::Value& jNumber);

private:
    void skipPlain()
    {
        while ('"' != *szAt_ && '\\' != *szAt_ && 0x20 <= static_cast<unsigned char>(*szAt_))
            ++szAt_;
    }

    bool skipDigits();
    bool readEscapedString(const char* szBegin, std::string_view& strText);
    bool readEscape();
    bool readCodePoint();
    bool readHex(unsigned& uCode);
    bool readReal(const char* szBegin, Json::Value& jNumber);

    const char* szAt_;
    std::string strUnescaped_;
};

}  // namespace vorn
