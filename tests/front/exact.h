// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests that compare what is stored with what was sent.
#pragma once

#include "support/json_text.h"

#include <iconv.h>
#include <cstdio>
#include <string>

// A record or value as a text that differs if a kind or a byte differs.
inline std::string exact(const Json::Value& jValue)
{
    if (jValue.isString())
        return "s" + std::to_string(jValue.asString().size()) + jValue.asString();
    if (Json::realValue == jValue.type()) {
        char szText[40];
        snprintf(szText, sizeof szText, "%a", jValue.asDouble());
        return szText;
    }
    std::string strText = jValue.isArray() ? "[" : "{";
    if (!jValue.isArray() && !jValue.isObject()) return jValue.isNull() ? "null" : text(jValue);
    for (auto it = jValue.begin(); it != jValue.end(); ++it)
        strText += (jValue.isObject() ? exact(it.name()) : "") + ":" + exact(*it) + ",";
    return strText;
}

inline std::string exactRecord(Json::Value jRecord)
{
    for (const std::string& strName : jRecord.getMemberNames())
        if (jRecord[strName].isNull()) jRecord.removeMember(strName);
    return exact(jRecord);
}

inline bool isUtf8(std::string strText)
{
    const iconv_t converter = iconv_open("UTF-32LE", "UTF-8");
    std::string strOut(4 * strText.size() + 4, '\0');
    char* pIn = strText.data();
    char* pOut = strOut.data();
    std::size_t nIn = strText.size();
    std::size_t nOut = strOut.size();
    const bool blConverted =
        static_cast<std::size_t>(-1) != iconv(converter, &pIn, &nIn, &pOut, &nOut);
    iconv_close(converter);
    return blConverted;
}
