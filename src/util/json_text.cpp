// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/json_text.h"

#include "util/plain_json.h"
#include "util/thread_state.h"

#include <json/reader.h>

#include <cstring>
#include <memory>

namespace vorn {

namespace {

Json::CharReader* newReader()
{
    Json::CharReaderBuilder builder;
    builder["collectComments"] = false;
    builder["allowSpecialFloats"] = true;
    // Some releases have a lower default, which would lose what others stored.
    builder["stackLimit"] = 1000;
    return builder.newCharReader();
}

struct Reader : ThreadPart {
    static constexpr Kind kKind = kReader;
    std::unique_ptr<Json::CharReader> pReader{newReader()};
};

bool isDepthLimit(const Json::RuntimeError& error)
{
    return nullptr != strstr(error.what(), "stackLimit");
}

}  // namespace

void fromString(const char* szText, Json::Value& jValue)
{
    if (readPlainJson(szText, jValue)) return;
    Json::CharReader& reader = *ofThisThread<Reader>().pReader;
    try {
        reader.parse(szText, szText + strlen(szText), &jValue, nullptr);
    } catch (const Json::RuntimeError& error) {
        if (!isDepthLimit(error)) throw;
        jValue = Json::nullValue;
    }
}

}  // namespace vorn
