// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The text of a column as the value of a member.
#pragma once

#include "util/json_text.h"
#include "util/type_words.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

namespace vorn {

// What strtoll reads, but faster if the text is nothing but digits and fits.
inline long long integerOf(const char* szText)
{
    constexpr int kFittingDigits = 18;
    const char* szDigit = szText;
    unsigned long long uValue = 0;
    for (; '0' <= *szDigit && *szDigit <= '9'; ++szDigit)
        uValue = uValue * 10 + static_cast<unsigned char>(*szDigit - '0');
    const bool blFits = '\0' == *szDigit && kFittingDigits >= szDigit - szText;
    return blFits ? static_cast<long long>(uValue) : strtoll(szText, nullptr, 10);
}

inline int saturatedToInt(long long iValue)
{
    return static_cast<int>(std::clamp<long long>(iValue, INT_MIN, INT_MAX));
}

// Sets the member from its column's text; a bool is already false.
inline void decode(RowForm form, const char* szValue, Json::Value& jMember)
{
    // Cheaper than an assignment, which moves comments and offsets too.
    const auto set = [&jMember](Json::Value jValue) { jMember.swapPayload(jValue); };
    switch (form) {
    case RowForm::kText: set(szValue); break;
    // Kept(RowCallback.StoresIntegersAsSigned): unsigned words are read through signed
    // conversions and saturate
    case RowForm::kInt32: set(saturatedToInt(integerOf(szValue))); break;
    case RowForm::kInt64: set(Json::Int64(integerOf(szValue))); break;
    case RowForm::kJson: fromString(szValue, jMember); break;
    case RowForm::kBool:
    case RowForm::kNo:  // which the caller has refused
        if (1 == integerOf(szValue)) set(true);
        break;
    }
}

}  // namespace vorn
