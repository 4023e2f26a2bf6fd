# The drive of kvsv-demo as a library of its own, so that the tests run it in every build tree,
# with or without the demonstration program.
add_library(kvsv_drive STATIC
  ${CMAKE_CURRENT_LIST_DIR}/database_calls.cpp
  ${CMAKE_CURRENT_LIST_DIR}/database_property_tour.cpp
  ${CMAKE_CURRENT_LIST_DIR}/database_tour.cpp
  ${CMAKE_CURRENT_LIST_DIR}/drive_scenario.cpp
  ${CMAKE_CURRENT_LIST_DIR}/drive_signals.cpp
  ${CMAKE_CURRENT_LIST_DIR}/library_exports.cpp
  ${CMAKE_CURRENT_LIST_DIR}/receive_filter_tour.cpp
  ${CMAKE_CURRENT_LIST_DIR}/signals_svg.cpp)
target_include_directories(kvsv_drive PUBLIC ${CMAKE_CURRENT_LIST_DIR})
# The host the demonstration plays offers the removal of references by name, as hosts do.
target_link_libraries(kvsv_drive PUBLIC svhost_byname kvor ${CMAKE_DL_LIBS})
