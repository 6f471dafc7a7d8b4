# The dynamic-field expression language and the update services it reaches rows through.
add_library(pex_expr_test_support STATIC ${CMAKE_CURRENT_SOURCE_DIR}/expr/expr_test_support.cpp)
target_link_libraries(pex_expr_test_support PUBLIC pex_commands pex_expr pex_test_support
                      GTest::gtest)
pex_warnings(pex_expr_test_support)

foreach(unit override_parser validation builtins execution_plan
             hostile_scripts)
  if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/expr/${unit}_test.cpp)
    pex_add_test(expr_${unit}_test
      SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/expr/${unit}_test.cpp
      LIBS pex_expr_test_support)
  endif()
endforeach()

if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/commands/update_services_test.cpp)
  pex_add_test(update_services_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/commands/update_services_test.cpp
    LIBS pex_expr_test_support)
endif()

if(TARGET expr_builtins_test)
  # FileVersionAtLeast reads a real Windows DLL with a version resource.
  target_compile_definitions(expr_builtins_test PRIVATE
    PEX_FIXTURE_DIR="${CMAKE_CURRENT_SOURCE_DIR}/fixtures")
endif()
if(TARGET expr_hostile_scripts_test)
  target_compile_definitions(expr_hostile_scripts_test PRIVATE
    PEX_FIXTURE_DIR="${CMAKE_CURRENT_SOURCE_DIR}/fixtures")
endif()
