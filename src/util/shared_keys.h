// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Names of members that all values of all threads share as their keys.
#pragma once

#include <json/value.h>

#include <atomic>
#include <cstddef>
#include <memory>
#include <string>
#include <string_view>

namespace vorn {

struct SharedKey {
    explicit SharedKey(std::string_view strOf) : strName(strOf) {}

    const std::string strName;
    // What objects look like whose first member has this name: an object with null for each member.
    // Null before the first such object; never changed and never released.
    std::atomic<const Json::Value*> pjShape{nullptr};
    // Whether such objects have been seen to differ, or have no shape.
    std::atomic<bool> blShapeless{false};
};

// The key of that name, which is never released; null if the name is too long or there is no room
// for it. What others have stored decides which names come, so there are only so many places.
inline SharedKey* sharedKey(std::string_view strName)
{
    constexpr std::size_t kPlaces = 512;
    constexpr std::size_t kLongest = 32;
    static std::atomic<SharedKey*> places[kPlaces];

    if (kLongest < strName.size()) return nullptr;
    std::size_t uHash = strName.size();
    for (const char c : strName) uHash = uHash * 31 + static_cast<unsigned char>(c);
    std::atomic<SharedKey*>& place = places[(uHash ^ uHash >> 9) % kPlaces];
    SharedKey* pKey = place.load(std::memory_order_acquire);
    if (nullptr == pKey) {
        // jsoncpp takes a shared key up to its first zero.
        if (std::string_view::npos != strName.find('\0')) return nullptr;
        auto pNew = std::make_unique<SharedKey>(strName);
        if (place.compare_exchange_strong(pKey, pNew.get(), std::memory_order_acq_rel))
            return pNew.release();
    }
    return pKey->strName == strName ? pKey : nullptr;
}

}  // namespace vorn
