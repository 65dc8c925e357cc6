# Helpers that keep the per-package CMake code to one line each.
#
# zr_add_library(<target> <exportName> DIRS <dir>... [DEPS <target>...])
#   A shared library from every .cpp in the given folders. The folders are public include
#   directories, so a consumer includes any header by its bare file name.
# zr_add_tests(<target> DIRS <dir>... DEPS <target>...)
#   One GoogleTest executable from every *_test.cpp in the given folders.

set(ZR_EXPORTED_TARGETS "" CACHE INTERNAL "")

function(zr_add_library target exportName)
  cmake_parse_arguments(ARG "" "" "DIRS;DEPS" ${ARGN})
  set(sources "")
  set(headers "")
  set(includeDirs "")
  foreach(dir IN LISTS ARG_DIRS)
    file(GLOB dirSources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.cpp)
    file(GLOB dirHeaders CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.h
                                            ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.inline
                                            ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.imp)
    list(APPEND sources ${dirSources})
    list(APPEND headers ${dirHeaders})
    list(APPEND includeDirs $<BUILD_INTERFACE:${CMAKE_CURRENT_SOURCE_DIR}/${dir}>)
  endforeach()
  if(NOT sources)
    # A package with headers only still needs one object so that it exists as a library.
    set(stub ${CMAKE_CURRENT_BINARY_DIR}/${target}_package.cpp)
    file(WRITE ${stub} "// ${target} has no compiled sources of its own yet.\n")
    list(APPEND sources ${stub})
  endif()
  add_library(${target} SHARED ${sources} ${headers})
  add_library(ZR::${exportName} ALIAS ${target})
  target_include_directories(${target} PUBLIC ${includeDirs}
                             $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}/ZR>)
  target_link_libraries(${target} PUBLIC ${ARG_DEPS})
  target_compile_definitions(${target} PRIVATE ZR_BUILD_TYPE="${CMAKE_BUILD_TYPE}")
  set_target_properties(${target} PROPERTIES EXPORT_NAME ${exportName}
                        VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR}
                        INSTALL_RPATH "$ORIGIN")
  install(FILES ${headers} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/ZR)
  set(ZR_EXPORTED_TARGETS ${ZR_EXPORTED_TARGETS} ${target} CACHE INTERNAL "")
endfunction()

function(zr_add_tests target)
  cmake_parse_arguments(ARG "" "" "DIRS;DEPS" ${ARGN})
  set(sources "")
  foreach(dir IN LISTS ARG_DIRS)
    file(GLOB dirSources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.cpp)
    list(APPEND sources ${dirSources})
  endforeach()
  if(NOT sources)
    return()
  endif()
  add_executable(${target} ${sources})
  target_include_directories(${target} PRIVATE ${ARG_DIRS})
  target_link_libraries(${target} PRIVATE ${ARG_DEPS} GTest::gtest GTest::gmock GTest::gtest_main)
  gtest_discover_tests(${target} DISCOVERY_TIMEOUT 60)
endfunction()

function(zr_install_package)
  include(CMakePackageConfigHelpers)
  install(TARGETS ${ZR_EXPORTED_TARGETS} EXPORT ZRrenderTargets
          LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
          ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
          RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
  install(EXPORT ZRrenderTargets NAMESPACE ZR::
          DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ZRrender)
  configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/ZRrenderConfig.cmake.in
    ${PROJECT_BINARY_DIR}/ZRrenderConfig.cmake
    INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ZRrender)
  write_basic_package_version_file(${PROJECT_BINARY_DIR}/ZRrenderConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
  install(FILES ${PROJECT_BINARY_DIR}/ZRrenderConfig.cmake
                ${PROJECT_BINARY_DIR}/ZRrenderConfigVersion.cmake
          DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ZRrender)
endfunction()
