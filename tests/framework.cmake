# Tests of the framework pieces: file class, synchronisation, machine lock, date parser, COM
# string, application object, file digests.
foreach(unit cfile sync machine_lock ole_date bstr app digest)
  set(source ${CMAKE_CURRENT_SOURCE_DIR}/platform/${unit}_test.cpp)
  if(EXISTS ${source})
    pex_add_test(platform_${unit}_test SOURCES ${source} LIBS pex_platform)
  endif()
endforeach()
