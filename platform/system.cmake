# The system area of the platform: processes, libraries, version information and install at
# restart. The parsers and the restart queue are portable; the rest comes from the backend.
set(PEX_SYSTEM_SRC
  ${CMAKE_CURRENT_SOURCE_DIR}/command_line.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/process_dispatch_wait.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/version_info_parse.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/pe_resources.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/pending_renames.cpp
)
if(WIN32)
  list(APPEND PEX_SYSTEM_SRC
    ${CMAKE_CURRENT_SOURCE_DIR}/win32/process.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/win32/library.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/win32/version_info.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/win32/setup_install.cpp)
else()
  list(APPEND PEX_SYSTEM_SRC
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/search_path.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/process.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/process_wait.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/library.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/elf_section.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/version_info.cpp
    ${CMAKE_CURRENT_SOURCE_DIR}/posix/setup_install.cpp)
endif()

add_library(pex_system STATIC ${PEX_SYSTEM_SRC})
# The other areas are named only when they exist, so this area builds at every stage. They
# follow pex_system on the link line because it calls into them.
target_link_libraries(pex_system PUBLIC
  $<TARGET_NAME_IF_EXISTS:pex_platform_base>
  $<TARGET_NAME_IF_EXISTS:pex_registry>
  $<TARGET_NAME_IF_EXISTS:pex_framework>
  ${CMAKE_DL_LIBS})
if(WIN32)
  # Install at restart, version information and the message pump.
  target_link_libraries(pex_system PUBLIC setupapi version user32)
endif()
list(APPEND PEX_PLATFORM_PARTS pex_system)
pex_warnings(pex_system)

# pex_stamp_version(): the modules and programs built after the platform stamp their version.
include(${CMAKE_SOURCE_DIR}/cmake/version_stamp.cmake)
