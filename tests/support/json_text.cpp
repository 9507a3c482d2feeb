// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/json_text.h"

#include <json/reader.h>
#include <json/writer.h>

#include <memory>

std::string text(const Json::Value& jValue)
{
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    builder["emitUTF8"] = true;
    builder["useSpecialFloats"] = true;
    return Json::writeString(builder, jValue);
}

Json::Value leftByReader(const std::string& strText)
{
    Json::CharReaderBuilder builder;
    builder["collectComments"] = false;
    builder["allowSpecialFloats"] = true;
    builder["stackLimit"] = 1000;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jLeft;
    pReader->parse(strText.data(), strText.data() + strText.size(), &jLeft, nullptr);
    return jLeft;
}
