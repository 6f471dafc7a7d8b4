# The update file model.
pex_add_test(upgrade_status_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/model/upgrade_status_test.cpp
  LIBS pex_model)

# Update files, their groups and the master list, on emulated machines.
foreach(unit update_file file_group master_list)
  pex_add_test(${unit}_test
    SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/model/${unit}_test.cpp
    LIBS pex_model)
endforeach()
