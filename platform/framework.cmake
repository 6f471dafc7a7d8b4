# The application framework's pieces: file class, synchronisation (the machine lock too) and
# time, date parser, COM string, application object; and the digests of files, which read through
# the file class. Portable code sits in platform/, the rest in the backend folder.
if(WIN32)
  set(PEX_FRAMEWORK_BACKEND win32)
else()
  set(PEX_FRAMEWORK_BACKEND posix)
endif()

add_library(pex_framework STATIC
  ${CMAKE_CURRENT_SOURCE_DIR}/cfile_exception.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/ole_date.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/bstr.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/app.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_FRAMEWORK_BACKEND}/cfile.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_FRAMEWORK_BACKEND}/append_file.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/machine_lock_wait.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_FRAMEWORK_BACKEND}/sync.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_FRAMEWORK_BACKEND}/machine_lock.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/digest.cpp
  ${CMAKE_CURRENT_SOURCE_DIR}/${PEX_FRAMEWORK_BACKEND}/sha256.cpp)
# Paths, errors and the fault plan come from the base; the application profile from the registry.
target_link_libraries(pex_framework PUBLIC pex_platform_base pex_registry)
# SHA-256 comes from the platform's maintained cryptography: BCrypt on Windows, libcrypto here.
if(WIN32)
  target_link_libraries(pex_framework PUBLIC bcrypt)
else()
  find_package(Threads REQUIRED)
  find_package(OpenSSL REQUIRED COMPONENTS Crypto)
  target_link_libraries(pex_framework PUBLIC Threads::Threads OpenSSL::Crypto)
endif()
pex_warnings(pex_framework)
list(APPEND PEX_PLATFORM_PARTS pex_framework)
