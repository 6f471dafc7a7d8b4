# The base of the platform: errors, the machine root, paths, files and the fault plan.
# The path rules are portable; the rest comes from the backend of the target.
if(WIN32)
  set(PEX_PLATFORM_BACKEND win32)
else()
  set(PEX_PLATFORM_BACKEND posix)
endif()

set(PEX_PLATFORM_BASE_SRC
  ${CMAKE_CURRENT_SOURCE_DIR}/path_rules.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/fault.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/errors.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/machine.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/paths.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/files.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/power_cut.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_PLATFORM_BACKEND}/regular_file.cpp
)
if(NOT WIN32)
  list(APPEND PEX_PLATFORM_BASE_SRC ${CMAKE_CURRENT_SOURCE_DIR}/posix/folder_flush.cpp)
endif()

add_library(pex_platform_base STATIC ${PEX_PLATFORM_BASE_SRC})
if(NOT WIN32)
  # dladdr for module file names.
  target_link_libraries(pex_platform_base PUBLIC ${CMAKE_DL_LIBS})
endif()
list(APPEND PEX_PLATFORM_PARTS pex_platform_base)
pex_warnings(pex_platform_base)
