# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# vornjsondb_hardening(TARGET): hardens it as Debian does its packages. What the compiler does applies to the
# configurations that optimise, and is left to whoever sets the flags where there is no configuration.
include(CheckCXXCompilerFlag)
include(CheckCXXSourceCompiles)

function(vornjsondb_hardening target)
  foreach(flag IN ITEMS -fstack-protector-strong -fcf-protection)
    string(MAKE_C_IDENTIFIER VORNJSONDB_COMPILER_KNOWS${flag} known)
    check_cxx_compiler_flag(${flag} ${known})
    if(${known})
      target_compile_options(${target} PRIVATE $<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:${flag}>)
    endif()
  endforeach()

  # Where the flags or the compiler itself define it, or do not optimise after all, it is left alone.
  foreach(config IN ITEMS ${CMAKE_CONFIGURATION_TYPES} ${CMAKE_BUILD_TYPE})
    if(NOT config MATCHES "^(Release|RelWithDebInfo|MinSizeRel)$")
      continue()
    endif()
    set(CMAKE_TRY_COMPILE_CONFIGURATION ${config})
    check_cxx_source_compiles("
      #if defined(_FORTIFY_SOURCE) || !defined(__OPTIMIZE__)
      #error
      #endif
      int main() {}" VORNJSONDB_FORTIFY_${config})
    if(VORNJSONDB_FORTIFY_${config})
      target_compile_definitions(${target} PRIVATE $<$<CONFIG:${config}>:_FORTIFY_SOURCE=2>)
    endif()
  endforeach()

  target_link_options(${target} PRIVATE -Wl,-z,relro -Wl,-z,now)
endfunction()
