# The update file model.
pex_add_test(upgrade_status_test
  SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/model/upgrade_status_test.cpp
  LIBS pex_model)
