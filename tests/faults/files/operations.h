// SPDX-License-Identifier: MIT
// Every operation of the library that touches the disk.
#pragma once

#include "faults/files/host.h"

#include <functional>
#include <ostream>
#include <string>
#include <vector>

struct Operation {
    const char* szName;
    // Whether the table exists already.
    bool blWithRecords;
    // The output object before the operation, as JSON text.
    const char* szOutput;
    // The result; the constructor's is -1 when it logged anything.
    std::function<int(Host&, Json::Value& jOutput)> run;
    // Of an undisturbed run.
    int iResult;

    friend std::ostream& operator<<(std::ostream& out, const Operation& operation)
    {
        return out << operation.szName;
    }
};

const std::vector<Operation>& operations();
