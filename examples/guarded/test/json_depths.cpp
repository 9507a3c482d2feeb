// SPDX-License-Identifier: MIT
// Prints how deep a JSON value may be nested before jsoncpp overflows a stack of 8 MiB. Every depth
// is tried in a process of its own. With an argument the program fails if one is less than that.

#include <json/reader.h>
#include <json/writer.h>

#include <pthread.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cstdio>
#include <string>
#include <utility>

namespace {

constexpr std::size_t kStack = 8 * 1024 * 1024;
constexpr int kMostDepth = 1 << 17;

using Operation = void (*)(std::size_t nDepth, bool blObject);

struct Trial {
    Operation run;
    std::size_t nDepth;
    bool blObject;
};

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
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    if (2 * nDepth > Json::writeString(builder, nested(nDepth, blObject)).size()) _exit(1);
}

void copy(std::size_t nDepth, bool blObject)
{
    if (nullptr == new Json::Value(nested(nDepth, blObject))) _exit(1);
}

void destroy(std::size_t nDepth, bool blObject)
{
    delete &nested(nDepth, blObject);
}

void* runOnThread(void* arg)
{
    const Trial& trial = *static_cast<Trial*>(arg);
    trial.run(trial.nDepth, trial.blObject);
    _exit(0);
}

bool survives(Trial trial)
{
    const pid_t iChild = fork();
    if (0 == iChild) {
        const rlimit noCore = {0, 0};
        setrlimit(RLIMIT_CORE, &noCore);
        if (nullptr == freopen("/dev/null", "w", stderr)) _exit(1);
        pthread_attr_t attributes;
        pthread_attr_init(&attributes);
        pthread_attr_setstacksize(&attributes, kStack);
        pthread_t thread;
        if (0 != pthread_create(&thread, &attributes, runOnThread, &trial)) _exit(1);
        pthread_join(thread, nullptr);
        _exit(1);
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
        if (survives({run, nGood + nStep, blObject})) nGood += nStep;
    return nGood;
}

}  // namespace

int main(int argc, char** argv)
{
    const std::size_t nLeast = 1 < argc ? std::stoul(argv[1]) : 0;
    bool blDeepEnough = true;
    const std::pair<const char*, Operation> operations[] = {
        {"reader", read}, {"writer", write}, {"copy", copy}, {"destructor", destroy}};
    for (const auto& [szName, run] : operations) {
        const std::size_t nArrays = deepest(run, false);
        const std::size_t nObjects = deepest(run, true);
        std::printf("%-10s  arrays %7zu  objects %7zu\n", szName, nArrays, nObjects);
        blDeepEnough = blDeepEnough && nLeast <= nArrays && nLeast <= nObjects;
    }
    return blDeepEnough ? 0 : 1;
}
