// SPDX-License-Identifier: MIT
#include "support/json_text.h"

#include <json/writer.h>

std::string text(const Json::Value& jValue)
{
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    builder["emitUTF8"] = true;
    builder["useSpecialFloats"] = true;
    return Json::writeString(builder, jValue);
}
