# Install commands: the item lists, the [REGISTRY] parameter parser, CommandString's list rules
# and the executors on an emulated machine.
if(TARGET pex_commands)
  foreach(unit item_list registry_command command_string command_executors)
    pex_add_test(commands_${unit}_test
      SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/commands/${unit}_test.cpp
      LIBS pex_commands)
  endforeach()
endif()

# The executors start pextestprog and register the test modules, found beside the test. Those
# are defined by another area's file, possibly later, so the wiring waits for the directory end.
function(pex_commands_test_helpers)
  foreach(helper pextestprog PexSelfReg PexNoSelfReg PexNoVersion)
    if(TARGET commands_command_executors_test AND TARGET ${helper})
      add_dependencies(commands_command_executors_test ${helper})
    endif()
  endforeach()
endfunction()
cmake_language(DEFER CALL pex_commands_test_helpers)
