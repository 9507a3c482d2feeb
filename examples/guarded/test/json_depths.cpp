// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Prints how deep a JSON value may be nested before jsoncpp, or the library's writer of JSON text,
// overflows a stack of 8 MiB. Every depth is tried in a process of its own. With an argument the
// program fails if one is less than that.

#include <VornJsonDbApi.h>

#include <json/reader.h>

#include <pthread.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cstdio>
#include <string>
#include <thread>
#include <utility>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

constexpr std::size_t kStack = 8 * 1024 * 1024;
constexpr int kMostDepth = 1 << 17;

using Operation = void (*)(std::size_t nDepth, bool blObject);

// Built from the inside, which does not recurse. Never destroyed: that does.
Json::Value& nested(std::size_t nDepth, bool blObject)
{
    auto* pjValue = new Json::Value(blObject ? Json::objectValue : Json::arrayValue);
    while (1 < nDepth--) {
        Json::Value jOuter;
        (blObject ? jOuter["k"] : jOuter[0U]).swap(*pjValue);
        pjValue->swap(jOuter);
    }
    return *pjValue;
}

void read(std::size_t nDepth, bool blObject)
{
    std::string strText;
    for (std::size_t n = 1; n < nDepth; ++n) strText += blObject ? "{\"k\":" : "[";
    strText += (blObject ? "{" : "[") + std::string(nDepth, blObject ? '}' : ']');
    Json::CharReaderBuilder builder;
    builder["stackLimit"] = kMostDepth + 1;
    Json::CharReader* pReader = builder.newCharReader();
    auto* pjValue = new Json::Value;
    if (!pReader->parse(strText.data(), strText.data() + strText.size(), pjValue, nullptr))
        _exit(1);
}

void write(std::size_t nDepth, bool blObject)
{
    std::string strName;
    std::string strText;
    Json::Value jDefinition;
    VornJsonDbApi api(nullptr, strName, jDefinition, strText);
    Json::Value jRequest;
    jRequest["limit"].swap(nested(nDepth, blObject));
    api.SqlFilterConditionFromJson(jRequest, strText);
    if (2 * nDepth > strText.size()) _exit(1);
    // Not destroyed, because that recurses.
    _exit(0);
}

void copy(std::size_t nDepth, bool blObject)
{
    if (nullptr == new Json::Value(nested(nDepth, blObject))) _exit(1);
}

void destroy(std::size_t nDepth, bool blObject)
{
    delete &nested(nDepth, blObject);
}

bool survives(Operation run, std::size_t nDepth, bool blObject)
{
    const pid_t iChild = fork();
    if (0 == iChild) {
        const rlimit noCore = {0, 0};
        setrlimit(RLIMIT_CORE, &noCore);
        for (FILE* pFile : {stdout, stderr})
            if (nullptr == freopen("/dev/null", "w", pFile)) _exit(1);
        std::thread([=] {
            run(nDepth, blObject);
            _exit(0);
        }).join();
    }
    int iStatus = 0;
    return iChild == waitpid(iChild, &iStatus, 0) && WIFEXITED(iStatus) &&
           0 == WEXITSTATUS(iStatus);
}

// The greatest depth that survives.
std::size_t deepest(Operation run, bool blObject)
{
    std::size_t nGood = 0;
    for (std::size_t nStep = kMostDepth; 0 < nStep; nStep /= 2)
        if (survives(run, nGood + nStep, blObject)) nGood += nStep;
    return nGood;
}

}  // namespace

int main(int argc, char** argv)
{
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    pthread_attr_setstacksize(&attributes, kStack);
    if (0 != pthread_setattr_default_np(&attributes)) return 2;
    const std::size_t nLeast = 1 < argc ? std::stoul(argv[1]) : 0;
    bool blDeepEnough = true;
    const std::pair<const char*, Operation> operations[] = {
        {"reader", read}, {"writer", write}, {"copy", copy}, {"destructor", destroy}};
    for (const auto& [szName, run] : operations) {
        const std::size_t nArrays = deepest(run, false);
        const std::size_t nObjects = deepest(run, true);
        std::printf("%-10s  arrays %7zu  objects %7zu\n", szName, nArrays, nObjects);
        // Or the children would write it again.
        fflush(stdout);
        blDeepEnough = blDeepEnough && nLeast <= nArrays && nLeast <= nObjects;
    }
    return blDeepEnough ? 0 : 1;
}
