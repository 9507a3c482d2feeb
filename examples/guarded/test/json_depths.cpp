// SPDX-License-Identifier: MIT
// Prints how deep a JSON value may be nested before jsoncpp overflows a stack of 8 MiB. Every depth
// is tried in a process of its own. With an argument the program fails where one is less than that.

#include <json/reader.h>
#include <json/writer.h>

#include <pthread.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <utility>

namespace {

constexpr std::size_t kStack = 8 * 1024 * 1024;
constexpr int kMostDepth = 1 << 17;

struct Trial {
    void (*run)(int iDepth, bool blObject);
    int iDepth;
    bool blObject;
};

// Built from the inside, which does not recurse. Never destroyed: that does.
Json::Value& nested(int iDepth, bool blObject)
{
    auto* pjValue = new Json::Value(blObject ? Json::objectValue : Json::arrayValue);
    for (int i = 1; i < iDepth; ++i) {
        Json::Value jOuter;
        (blObject ? jOuter["k"] : jOuter[0U]).swap(*pjValue);
        pjValue->swap(jOuter);
    }
    return *pjValue;
}

void read(int iDepth, bool blObject)
{
    const auto uDepth = static_cast<std::size_t>(iDepth);
    std::string strText;
    for (int i = 1; i < iDepth; ++i) strText += blObject ? "{\"k\":" : "[";
    strText += blObject ? "{" : "[";
    strText.append(uDepth, blObject ? '}' : ']');
    Json::CharReaderBuilder builder;
    builder["stackLimit"] = kMostDepth + 1;
    Json::CharReader* pReader = builder.newCharReader();
    auto* pjValue = new Json::Value;
    if (!pReader->parse(strText.data(), strText.data() + strText.size(), pjValue, nullptr))
        _exit(1);
}

void write(int iDepth, bool blObject)
{
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    const std::string strText = Json::writeString(builder, nested(iDepth, blObject));
    if (2 * static_cast<std::size_t>(iDepth) > strText.size()) _exit(1);
}

void copy(int iDepth, bool blObject)
{
    const auto* pjCopy = new Json::Value(nested(iDepth, blObject));
    if (nullptr == pjCopy) _exit(1);
}

void destroy(int iDepth, bool blObject)
{
    delete &nested(iDepth, blObject);
}

void* runOnThread(void* arg)
{
    const Trial& trial = *static_cast<Trial*>(arg);
    trial.run(trial.iDepth, trial.blObject);
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
int deepest(Trial trial)
{
    int iGood = 0;
    for (int iStep = kMostDepth; 0 < iStep; iStep /= 2) {
        trial.iDepth = iGood + iStep;
        if (survives(trial)) iGood = trial.iDepth;
    }
    return iGood;
}

}  // namespace

int main(int argc, char** argv)
{
    const int iLeast = 1 < argc ? std::atoi(argv[1]) : 0;
    const struct {
        const char* szName;
        void (*run)(int iDepth, bool blObject);
    } operations[] = {{"reader", read}, {"writer", write}, {"copy", copy}, {"destructor", destroy}};
    bool blDeepEnough = true;
    for (const auto& operation : operations) {
        const int iArrays = deepest({operation.run, 0, false});
        const int iObjects = deepest({operation.run, 0, true});
        std::printf("%-10s  arrays %7d  objects %7d\n", operation.szName, iArrays, iObjects);
        blDeepEnough = blDeepEnough && iLeast <= iArrays && iLeast <= iObjects;
    }
    return blDeepEnough ? 0 : 1;
}
