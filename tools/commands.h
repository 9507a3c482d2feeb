// SPDX-License-Identifier: MIT
// The commands, one topic a file. Each returns the exit status, or throws what failure.h declares.
#pragma once

#include "arguments.h"
#include "output.h"

namespace tool {

int describe(const Arguments& arguments, Output& output);
int infer(const Arguments& arguments, Output& output);

}  // namespace tool
