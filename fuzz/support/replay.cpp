// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Runs a target on files and on the files of folders, as libFuzzer does with a corpus: for tests
// and for looking at a finding without libFuzzer.

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize);

namespace {

int iInputs = 0;

void replay(const std::filesystem::path& path)
{
    if (std::filesystem::is_directory(path)) {
        for (const auto& entry : std::filesystem::directory_iterator(path)) replay(entry.path());
        return;
    }
    std::ifstream stream(path, std::ios::binary);
    const std::string strInput{std::istreambuf_iterator<char>(stream), {}};
    fprintf(stderr, "%s\n", path.c_str());
    LLVMFuzzerTestOneInput(reinterpret_cast<const uint8_t*>(strInput.data()), strInput.size());
    ++iInputs;
}

}  // namespace

int main(int iArguments, char** arguments)
{
    for (int i = 1; i < iArguments; ++i) replay(arguments[i]);
    printf("%d inputs\n", iInputs);
    return 0 < iInputs ? 0 : 1;
}
