// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// jsoncpp's reader and writer as a careful host keeps them: made once, without comments.
#pragma once

#include "workload.h"

#include <json/reader.h>
#include <json/writer.h>

#include <memory>
#include <sstream>
#include <string>
#include <string_view>

namespace bench {

inline Json::Value jsonOf(std::string_view text)
{
    return {text.data(), text.data() + text.size()};
}

class JsoncppText {
public:
    JsoncppText()
    {
        Json::CharReaderBuilder readers;
        readers["collectComments"] = false;
        reader_.reset(readers.newCharReader());
        Json::StreamWriterBuilder writers;
        writers["commentStyle"] = "None";
        writers["indentation"] = "";
        writers["emitUTF8"] = true;
        writer_.reset(writers.newStreamWriter());
    }

    void read(std::string_view text, Json::Value& jValue)
    {
        must(reader_->parse(text.data(), text.data() + text.size(), &jValue, nullptr), "JSON text");
    }

    std::string write(const Json::Value& jValue)
    {
        stream_.str({});
        writer_->write(jValue, &stream_);
        return stream_.str();
    }

private:
    std::unique_ptr<Json::CharReader> reader_;
    std::unique_ptr<Json::StreamWriter> writer_;
    std::ostringstream stream_;
};

}  // namespace bench
