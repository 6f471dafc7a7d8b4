# Rivzip.dll: the SZDD codec through its byte interfaces, against independent tools (samples made
# by mscompress, and libmspack when it is installed), and the module's entries on
# CFile objects.
if(TARGET rivzip_codec)
  pex_add_test(rivzip_codec_test
    SOURCES rivzip/memory_streams.cpp rivzip/szdd_codec_test.cpp
    LIBS rivzip_codec)

  pex_add_test(rivzip_interop_test
    SOURCES rivzip/memory_streams.cpp rivzip/szdd_interop_test.cpp
    LIBS rivzip_codec)
  target_compile_definitions(rivzip_interop_test PRIVATE
    RIVZIP_FIXTURES="${CMAKE_CURRENT_SOURCE_DIR}/fixtures/szdd")
  find_path(PEX_MSPACK_INCLUDE_DIR mspack.h)
  find_library(PEX_MSPACK_LIBRARY mspack)
  if(PEX_MSPACK_INCLUDE_DIR AND PEX_MSPACK_LIBRARY)
    target_compile_definitions(rivzip_interop_test PRIVATE PEX_HAVE_MSPACK=1)
    target_include_directories(rivzip_interop_test SYSTEM PRIVATE ${PEX_MSPACK_INCLUDE_DIR})
    target_link_libraries(rivzip_interop_test PRIVATE ${PEX_MSPACK_LIBRARY})
  endif()
endif()

if(TARGET Rivzip)
  # Loads Rivzip.dll by its bare name, which the loader finds beside the test program.
  pex_add_test(rivzip_module_test
    SOURCES rivzip/memory_streams.cpp rivzip/rivzip_module_test.cpp
    LIBS rivzip_codec)
  add_dependencies(rivzip_module_test Rivzip)
endif()
