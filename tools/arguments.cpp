// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "arguments.h"

#include "failure.h"

#include <getopt.h>

#include <cerrno>
#include <cstdlib>

namespace tool {

namespace {

constexpr option kOptions[] = {{"add-key", required_argument, nullptr, 0},
                               {"after", required_argument, nullptr, 0},
                               {"all", no_argument, nullptr, 0},
                               {"array", required_argument, nullptr, 0},
                               {"batch", required_argument, nullptr, 0},
                               {"csv", no_argument, nullptr, 0},
                               {"help", no_argument, nullptr, 'h'},
                               {"key", required_argument, nullptr, 0},
                               {"limit", required_argument, nullptr, 0},
                               {"offset", required_argument, nullptr, 0},
                               {"sort", required_argument, nullptr, 0},
                               {"table", required_argument, nullptr, 0},
                               {"verbose", no_argument, nullptr, 'v'},
                               {"version", no_argument, nullptr, 'V'},
                               {nullptr, 0, nullptr, 0}};

}  // namespace

std::string Arguments::option(const std::string& strOption, const std::string& strDefault) const
{
    const auto found = options.find(strOption);
    return options.end() == found ? strDefault : found->second;
}

long long Arguments::number(const std::string& strOption, long long iLeast,
                            long long iDefault) const
{
    if (!has(strOption)) return iDefault;
    const std::string strValue = option(strOption);
    char* szEnd = nullptr;
    errno = 0;
    const long long iValue = std::strtoll(strValue.c_str(), &szEnd, 10);
    if (strValue.empty() || '\0' != *szEnd || 0 != errno || iLeast > iValue)
        throw UsageError("option --" + strOption + ": \"" + strValue +
                         "\", expected a number from " + std::to_string(iLeast));
    return iValue;
}

std::string Arguments::value(std::size_t uPosition, const std::string& strDefault) const
{
    return uPosition < values.size() ? values[uPosition] : strDefault;
}

Arguments parseArguments(int argc, char** argv)
{
    Arguments arguments;
    opterr = 0;
    int iIndex = 0;
    for (int c = 0; - 1 != (c = getopt_long(argc, argv, ":hvV", kOptions, &iIndex));) {
        const std::string strWord = argv[optind - 1];
        switch (c) {
        case 'h': arguments.blHelp = true; break;
        case 'v': arguments.blVerbose = true; break;
        case 'V': arguments.blVersion = true; break;
        case ':': throw UsageError("option " + strWord + ": no value");
        case '?': throw UsageError("option " + strWord + ": unknown");
        default: arguments.options[kOptions[iIndex].name] = nullptr == optarg ? "" : optarg;
        }
    }
    for (int i = optind; i < argc; ++i)
        if (optind == i)
            arguments.strCommand = argv[i];
        else
            arguments.values.emplace_back(argv[i]);
    return arguments;
}

}  // namespace tool
