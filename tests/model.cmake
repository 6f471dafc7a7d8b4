# Update files, their groups and the master list, on emulated machines.
foreach(unit update_file master_list)
  pex_add_test(${unit}_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/model/${unit}_test.cpp
    LIBS pex_model)
endforeach()
