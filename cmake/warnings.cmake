# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# vornjsondb_warnings(TARGET [FLAG...]): the warnings that the project is clean of, as errors when
# VORNJSONDB_WERROR is on.
option(VORNJSONDB_WERROR "Treat warnings as errors" OFF)

function(vornjsondb_warnings target)
  target_compile_options(${target} PRIVATE -Wall -Wextra -Wconversion -Wshadow -Wformat=2 ${ARGN}
    $<$<BOOL:${VORNJSONDB_WERROR}>:-Werror>)
endfunction()
