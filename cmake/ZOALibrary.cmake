# zoa_add_library(<name> <export name> <file name> <sources>...): a library
# beside the core. <name>_objects holds the objects (tests and tools link them
# beside the static core copy); <name> is the installed static library
# ZOA::<export name> (lib<file name>.a), linking the shared core.
function(zoa_add_library name export file)
  add_library(${name}_objects OBJECT ${ARGN})
  set_target_properties(${name}_objects PROPERTIES POSITION_INDEPENDENT_CODE ON)
  target_include_directories(${name}_objects PUBLIC
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/src>)
  target_compile_options(${name}_objects PRIVATE ${ZOA_WARNINGS})
  target_compile_features(${name}_objects PUBLIC cxx_std_17)

  add_library(${name} STATIC $<TARGET_OBJECTS:${name}_objects>)
  add_library(ZOA::${export} ALIAS ${name})
  set_target_properties(${name} PROPERTIES OUTPUT_NAME ${file} EXPORT_NAME ${export} POSITION_INDEPENDENT_CODE ON)
  target_include_directories(${name} PUBLIC
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>
    $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
  target_link_libraries(${name} PUBLIC zoa)
endfunction()
