# pex_stamp_version(target FILE_DESCRIPTION "..." [STRINGS Name=Value...])
#
# Stamps the project version into a module or program as Windows version information: fixed
# file and product version PEX_VERSION_MAJOR.MINOR.BUILD.REVISION, translation 0409 04E4 (US
# English, Windows Latin-1), and the strings CompanyName "Vantric", FileDescription,
# FileVersion, InternalName, OriginalFilename, ProductName and ProductVersion, plus any extra
# STRINGS. On Windows this is a VERSIONINFO resource; on ELF hosts the same block is generated
# at build time into the ".pexver" section, which plat::ver reads.
#
# Functions are global in CMake, so this file may be included from any directory; the
# values are taken when the function runs, from the top-level PEX_VERSION_* variables.
function(pex_stamp_version target)
  set(PEX_VERSION_TEXT "${PEX_VERSION_MAJOR}.${PEX_VERSION_MINOR}.${PEX_VERSION_BUILD}.${PEX_VERSION_REVISION}")
  set(PEX_VERSION_LANGUAGE 0409)
  set(PEX_VERSION_CODE_PAGE 04E4)
  cmake_parse_arguments(V "" "FILE_DESCRIPTION" "STRINGS" ${ARGN})
  get_target_property(kind ${target} TYPE)
  if(kind STREQUAL "EXECUTABLE")
    set(filetype APP)
  else()
    set(filetype DLL)
  endif()
  set(strings
    "CompanyName=Vantric"
    "FileDescription=${V_FILE_DESCRIPTION}"
    "FileVersion=${PEX_VERSION_TEXT}"
    "InternalName=$<TARGET_FILE_BASE_NAME:${target}>"
    "OriginalFilename=$<TARGET_FILE_NAME:${target}>"
    "ProductName=Vantric Desktop Suite"
    "ProductVersion=${PEX_VERSION_TEXT}"
    ${V_STRINGS})
  if(WIN32)
    _pex_stamp_version_rc(${target} ${filetype} ${PEX_VERSION_TEXT} "${strings}")
    return()
  endif()
  if(NOT TARGET pex_version_stamp_gen)
    add_executable(pex_version_stamp_gen ${CMAKE_SOURCE_DIR}/cmake/version_stamp_gen.cpp)
    set_target_properties(pex_version_stamp_gen PROPERTIES
      RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/host-tools)
    pex_warnings(pex_version_stamp_gen)
  endif()
  set(out ${CMAKE_CURRENT_BINARY_DIR}/${target}_version_block.c)
  add_custom_command(OUTPUT ${out}
    COMMAND pex_version_stamp_gen ${out} ${filetype} ${PEX_VERSION_TEXT}
            ${PEX_VERSION_LANGUAGE} ${PEX_VERSION_CODE_PAGE} ${strings}
    DEPENDS pex_version_stamp_gen
    COMMENT "Stamping the version of ${target}"
    VERBATIM)
  target_sources(${target} PRIVATE ${out})
endfunction()

# The Windows form: a VERSIONINFO resource compiled by the resource compiler.
function(_pex_stamp_version_rc target filetype version strings)
  set(PEX_VERSION_LANGUAGE 0409)
  set(PEX_VERSION_CODE_PAGE 04E4)
  string(REPLACE "." "," commas "${version}")
  if(filetype STREQUAL "APP")
    set(vft 1)
  else()
    set(vft 2)
  endif()
  set(values "")
  foreach(s ${strings})
    string(FIND "${s}" "=" eq)
    string(SUBSTRING "${s}" 0 ${eq} name)
    math(EXPR from "${eq} + 1")
    string(SUBSTRING "${s}" ${from} -1 value)
    string(APPEND values "      VALUE \"${name}\", \"${value}\\0\"\n")
  endforeach()
  set(rc ${CMAKE_CURRENT_BINARY_DIR}/${target}_version.rc)
  file(GENERATE OUTPUT ${rc} CONTENT
"1 VERSIONINFO
FILEVERSION ${commas}
PRODUCTVERSION ${commas}
FILEFLAGSMASK 0x3F
FILEFLAGS 0
FILEOS 0x40004
FILETYPE ${vft}
FILESUBTYPE 0
BEGIN
  BLOCK \"StringFileInfo\"
  BEGIN
    BLOCK \"${PEX_VERSION_LANGUAGE}${PEX_VERSION_CODE_PAGE}\"
    BEGIN
${values}    END
  END
  BLOCK \"VarFileInfo\"
  BEGIN
    VALUE \"Translation\", 0x${PEX_VERSION_LANGUAGE}, 0x${PEX_VERSION_CODE_PAGE}
  END
END
")
  target_sources(${target} PRIVATE ${rc})
endfunction()
