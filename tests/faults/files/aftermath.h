// SPDX-License-Identifier: MIT
// What must hold after an operation, whatever failed in it.
#pragma once

#include "faults/files/host.h"

#include <string>
#include <vector>

// The connection has no open statement and its mutex is free; another connection writes at once,
// finds the file sound and one of these contents in it; the handle works on.
void expectNothingLeft(Host& host, const DiskFile& file, const std::vector<std::string>& contents);
