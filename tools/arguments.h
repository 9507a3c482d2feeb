// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The command line: vornjsondb [-v] COMMAND [OPTION...] [ARGUMENT...]
#pragma once

#include <map>
#include <string>
#include <vector>

namespace tool {

struct Arguments {
    bool blVerbose = false;
    bool blHelp = false;
    bool blVersion = false;
    std::string strCommand;
    std::vector<std::string> values;
    std::map<std::string, std::string> options;  // without the dashes; empty for a flag

    bool has(const std::string& strOption) const { return 0 != options.count(strOption); }
    // The value of an option, or the default.
    std::string option(const std::string& strOption, const std::string& strDefault = "") const;
    // The same as a number; throws UsageError if it is not one from iLeast.
    long long number(const std::string& strOption, long long iLeast, long long iDefault) const;
    // The argument at the position, or the default.
    std::string value(std::size_t uPosition, const std::string& strDefault) const;
};

// Throws UsageError for an option that no command has.
Arguments parseArguments(int argc, char** argv);

}  // namespace tool
