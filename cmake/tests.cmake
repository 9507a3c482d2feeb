# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# What the tests need: where it is missing they are left out, and the build of the library goes on.

# vornjsondb_left_out(TESTS REASON): a status line, or an error where all tests are required.
function(vornjsondb_left_out tests reason)
  set(kind STATUS)
  if(VORNJSONDB_REQUIRE_TESTS)
    set(kind FATAL_ERROR)
  endif()
  message(${kind} "${tests}: left out, ${reason}")
endfunction()

find_package(GTest QUIET)
if(NOT GTest_FOUND)
  vornjsondb_left_out("All tests" "GoogleTest was not found")
  set(VORNJSONDB_TESTS OFF)
elseif(DEFINED BUILD_SHARED_LIBS AND NOT BUILD_SHARED_LIBS)
  vornjsondb_left_out("All tests" "they are for the shared library")
  set(VORNJSONDB_TESTS OFF)
endif()

find_program(VORNJSONDB_HARDENING_CHECK hardening-check)
if(VORNJSONDB_TESTS AND NOT VORNJSONDB_HARDENING_CHECK)
  vornjsondb_left_out("The test of the library with hardening-check" "it was not found")
endif()

find_program(VORNJSONDB_MESON meson)
if(VORNJSONDB_TESTS AND NOT VORNJSONDB_MESON)
  vornjsondb_left_out("The test of a host that is built by Meson" "it was not found")
endif()
