# The decompression dispatcher: compression codes, where Rivzip.dll is looked for, the progress
# thinning, and expansion in place with Rivzip.dll and zlib.
#
# The program is built apart from bin/: Windows searches a bare library name in the program's
# own folder first, and bin/ holds the built Rivzip.dll, so there the search would always find
# it. Apart, the search finds only the copies (or stand-ins) that each test places on its machine.
if(TARGET pex_decompress AND TARGET Rivzip)
  pex_add_test(decompress_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/decompress/dispatcher_test.cpp
    LIBS pex_decompress rivzip_codec)
  set_target_properties(decompress_test PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/decompress)
  target_compile_definitions(decompress_test PRIVATE PEX_RIVZIP_DLL="$<TARGET_FILE:Rivzip>")
  add_dependencies(decompress_test Rivzip)
endif()
