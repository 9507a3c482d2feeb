// SPDX-License-Identifier: MIT
#include "json_of.h"

#include <json/reader.h>
#include <json/writer.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

Json::Value jsonOf(const std::string& strText)
{
    const std::unique_ptr<Json::CharReader> pReader(Json::CharReaderBuilder().newCharReader());
    Json::Value jValue;
    if (!pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr)) {
        fprintf(stderr, "no JSON: %s\n", strText.c_str());
        abort();
    }
    return jValue;
}

std::string textOf(const Json::Value& jValue)
{
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, jValue);
}
