#include "util/json_text.h"

#include <json/reader.h>
#include <json/writer.h>

#include <cstring>
#include <sstream>

namespace {

// Reader and writer are never destroyed: a handle in a global variable of the host may still work
// while the process exits.
Json::StreamWriter& writer()
{
    static Json::StreamWriter* pWriter = [] {
        Json::StreamWriterBuilder builder;
        builder["commentStyle"] = "None";
        builder["indentation"] = "";
        builder["emitUTF8"] = true;
        builder["useSpecialFloats"] = true;
        builder["precision"] = 17;
        return builder.newStreamWriter();
    }();
    return *pWriter;
}

Json::CharReader& reader()
{
    static Json::CharReader* pReader = [] {
        Json::CharReaderBuilder builder;
        builder["collectComments"] = false;
        builder["allowSpecialFloats"] = true;
        return builder.newCharReader();
    }();
    return *pReader;
}

bool isDepthLimit(const Json::RuntimeError& error)
{
    return nullptr != strstr(error.what(), "stackLimit");
}

}  // namespace

std::string toString(const Json::Value& jValue)
{
    std::ostringstream stream;
    writer().write(jValue, &stream);
    return stream.str();
}

void fromString(const char* szText, Json::Value& jValue)
{
    try {
        reader().parse(szText, szText + strlen(szText), &jValue, nullptr);
    } catch (const Json::RuntimeError& error) {
        if (!isDepthLimit(error)) throw;
        jValue = Json::nullValue;
    }
}
