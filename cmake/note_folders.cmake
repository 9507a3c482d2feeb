# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# While installing: adds those of the folders that are not there yet, and their parents, to the notes, the inner
# ones first.
set(noted)
if(EXISTS "${notes}")
  file(STRINGS "${notes}" earlier)
  foreach(folder IN LISTS earlier)
    if(IS_DIRECTORY "$ENV{DESTDIR}${folder}")
      list(APPEND noted "${folder}")
    endif()
  endforeach()
endif()
foreach(folder IN LISTS folders)
  cmake_path(ABSOLUTE_PATH folder BASE_DIRECTORY "${CMAKE_INSTALL_PREFIX}")
  while(NOT folder STREQUAL "/" AND NOT EXISTS "$ENV{DESTDIR}${folder}")
    list(APPEND noted "${folder}")
    cmake_path(GET folder PARENT_PATH folder)
  endwhile()
endforeach()
list(REMOVE_DUPLICATES noted)
list(SORT noted ORDER DESCENDING)
list(JOIN noted "\n" noted)
file(WRITE "${notes}" "${noted}\n")
