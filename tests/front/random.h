// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests that draw what they do. VORN_FRONT_RECORDS and VORN_FRONT_REQUESTS say how
// much, VORN_FRONT_SEED where the draws begin.
#pragma once

#include "hostile/hostile_roles.h"

#include <cstdlib>
#include <random>
#include <string>

inline long long fromEnvironment(const char* szName, long long iDefault)
{
    const char* szValue = getenv(szName);
    return nullptr == szValue ? iDefault : std::atoll(szValue);
}

class Draws {
public:
    // 0 to nBelow - 1
    std::size_t below(std::size_t nBelow) { return engine_() % nBelow; }
    bool once(std::size_t nTimes) { return 0 == below(nTimes); }

    template <typename Items>
    const auto& of(const Items& items)
    {
        return *(std::begin(items) + static_cast<std::ptrdiff_t>(below(std::size(items))));
    }

    // A hostile text; the long ones seldom.
    const std::string& text()
    {
        const std::string& strText = of(hostileStrings());
        return 200 < strText.size() && !once(50) ? text() : strText;
    }

    // Any JSON; the texts and names in it are hostile.
    Json::Value value(int iLevel = 0)
    {
        switch (below(3 < iLevel ? 6 : 8)) {
        case 0: return text();
        case 1: return Json::Int64(engine_());
        case 2: return Json::UInt64(engine_());
        case 3:
            return std::ldexp(static_cast<double>(engine_()), static_cast<int>(below(100)) - 90);
        case 4: return once(2);
        case 5: return Json::Value();
        case 6: return array(iLevel);
        default: return object(iLevel);
        }
    }

    Json::Value array(int iLevel = 0)
    {
        Json::Value jArray(Json::arrayValue);
        for (std::size_t n = below(4); 0 < n; --n) jArray.append(value(iLevel + 1));
        return jArray;
    }

    Json::Value object(int iLevel = 0)
    {
        Json::Value jObject(Json::objectValue);
        for (std::size_t n = below(4); 0 < n; --n) jObject[text()] = value(iLevel + 1);
        return jObject;
    }

private:
    std::mt19937_64 engine_{static_cast<std::uint64_t>(fromEnvironment("VORN_FRONT_SEED", 1))};
};
