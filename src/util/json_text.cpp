// SPDX-License-Identifier: MIT
#include "util/json_text.h"

#include "util/thread_state.h"

#include <json/reader.h>
#include <json/writer.h>

#include <cstring>
#include <memory>
#include <ostream>
#include <streambuf>
#include <utility>

namespace vorn {

namespace {

// Bytes that suffice for most texts.
constexpr std::size_t kUsualText = 128;

// Collects in a string what a stream writes.
class StringBuffer : public std::streambuf {
public:
    void start()
    {
        strText_.clear();
        strText_.reserve(kUsualText);
    }
    std::string take() { return std::exchange(strText_, std::string()); }

protected:
    // GCOVR_EXCL_START: jsoncpp writes whole strings.
    int_type overflow(int_type c) override
    {
        strText_ += traits_type::to_char_type(c);
        return c;
    }
    // GCOVR_EXCL_STOP

    std::streamsize xsputn(const char* szText, std::streamsize nText) override
    {
        strText_.append(szText, static_cast<std::size_t>(nText));
        return nText;
    }

private:
    std::string strText_;
};

class Writer : public ThreadPart {
public:
    static constexpr Kind kKind = kWriter;

    Writer()
    {
        // So that running out of memory reaches the caller instead of leaving half a text.
        stream_.exceptions(std::ios_base::badbit);
        Json::StreamWriterBuilder builder;
        builder["commentStyle"] = "None";
        builder["indentation"] = "";
        builder["emitUTF8"] = true;
        builder["useSpecialFloats"] = true;
        builder["precision"] = 17;
        pWriter_.reset(builder.newStreamWriter());
    }

    std::string text(const Json::Value& jValue)
    {
        buffer_.start();
        stream_.clear();
        pWriter_->write(jValue, &stream_);
        return buffer_.take();
    }

private:
    StringBuffer buffer_;
    std::ostream stream_{&buffer_};
    std::unique_ptr<Json::StreamWriter> pWriter_;
};

// Not inlined, because its frame would slow down every parse.
[[gnu::noinline]] Json::CharReader* newReader()
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

std::string toString(const Json::Value& jValue)
{
    return ofThisThread<Writer>().text(jValue);
}

void fromString(const char* szText, Json::Value& jValue)
{
    Json::CharReader& reader = *ofThisThread<Reader>().pReader;
    try {
        reader.parse(szText, szText + strlen(szText), &jValue, nullptr);
    } catch (const Json::RuntimeError& error) {
        if (!isDepthLimit(error)) throw;
        jValue = Json::nullValue;
    }
}

}  // namespace vorn
