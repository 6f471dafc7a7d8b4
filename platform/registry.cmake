# The registry: the backend's store (SQLite on the emulated machine, the real one on Windows)
# and the portable pieces over it (key paths, `reg query` output, .reg files).
set(PEX_REGISTRY_SRC
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_path.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_tree.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_data.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_query.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_text.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_file_read.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_file_write.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/reg_file_apply.cpp
)
if(WIN32)
  file(GLOB PEX_REGISTRY_BACKEND_SRC ${CMAKE_CURRENT_SOURCE_DIR}/win32/registry*.cpp)
else()
  file(GLOB PEX_REGISTRY_BACKEND_SRC ${CMAKE_CURRENT_SOURCE_DIR}/posix/registry*.cpp)
endif()

add_library(pex_registry STATIC ${PEX_REGISTRY_SRC} ${PEX_REGISTRY_BACKEND_SRC})
target_link_libraries(pex_registry PUBLIC pex_platform_base)
if(NOT WIN32)
  find_package(SQLite3 QUIET)
  if(SQLite3_FOUND)
    target_link_libraries(pex_registry PRIVATE SQLite::SQLite3)
  else()
    target_link_libraries(pex_registry PRIVATE sqlite3)
  endif()
endif()
list(APPEND PEX_PLATFORM_PARTS pex_registry)
pex_warnings(pex_registry)
