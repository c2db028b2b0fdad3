# How the targets of this tree are made, so that each CMakeLists.txt says only what it holds and what it links.

find_program(PANORAMIC_CCACHE ccache)
if(PANORAMIC_CCACHE)
    # Precompiled headers are cached only when ccache may overlook their timestamps.
    set(CMAKE_CXX_COMPILER_LAUNCHER "${CMAKE_COMMAND};-E;env;CCACHE_SLOPPINESS=pch_defines,time_macros;${PANORAMIC_CCACHE}")
endif()
find_program(PANORAMIC_MOLD mold)
if(PANORAMIC_MOLD AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    add_link_options(-fuse-ld=mold)
endif()

add_compile_options(-Wall -Wextra -Wpedantic -Werror -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual)
if(PANORAMIC_SANITIZE)
    add_compile_options(-fsanitize=${PANORAMIC_SANITIZE} -fno-sanitize-recover=undefined)
    add_link_options(-fsanitize=${PANORAMIC_SANITIZE})
    # The scene graph library's own headers trip the vptr check across its shared objects.
    if(PANORAMIC_SANITIZE MATCHES "undefined")
        add_compile_options(-fno-sanitize=vptr)
    endif()
    # GCC 12 takes parts of its own <regex> for uninitialised when the sanitizers change what is inlined.
    if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
        add_compile_options(-Wno-maybe-uninitialized)
    endif()
endif()

# The scene graph library as one target, its headers taken as system headers.
add_library(panoramic_osg INTERFACE)
function(panoramic_link_osg)
    target_include_directories(panoramic_osg SYSTEM INTERFACE ${OPENSCENEGRAPH_INCLUDE_DIRS})
    target_link_libraries(panoramic_osg INTERFACE ${OPENSCENEGRAPH_LIBRARIES})
endfunction()

# panoramic_library(NAME SOURCES a.cpp ... LINKS lower ...): a static library that is seen from src/.
function(panoramic_library name)
    cmake_parse_arguments(arg "" "" "SOURCES;LINKS" ${ARGN})
    add_library(${name} STATIC ${arg_SOURCES})
    target_include_directories(${name} PUBLIC "${CMAKE_SOURCE_DIR}/src")
    target_link_libraries(${name} PUBLIC ${arg_LINKS})
endfunction()

# panoramic_test(NAME SOURCES a.cpp ... LINKS lib ...): one test program, one ctest entry.
function(panoramic_test name)
    cmake_parse_arguments(arg "" "TIMEOUT" "SOURCES;LINKS" ${ARGN})
    if(NOT arg_TIMEOUT)
        set(arg_TIMEOUT 300)
    endif()
    add_executable(${name} ${arg_SOURCES})
    target_include_directories(${name} PRIVATE "${CMAKE_SOURCE_DIR}/src" "${CMAKE_SOURCE_DIR}")
    target_link_libraries(${name} PRIVATE ${arg_LINKS} GTest::gtest GTest::gmock GTest::gtest_main)
    # Beside the programs, so that what looks for plugins/ and Assets/ next to itself finds them.
    add_test(NAME ${name} COMMAND ${name})
    set_tests_properties(${name} PROPERTIES TIMEOUT ${arg_TIMEOUT})
endfunction()

# panoramic_plugin(NAME SOURCES a.cpp ... LINKS lib ...): a module in plugins/ beside the programs.
function(panoramic_plugin name)
    cmake_parse_arguments(arg "" "" "SOURCES;LINKS" ${ARGN})
    add_library(${name} MODULE ${arg_SOURCES})
    target_include_directories(${name} PRIVATE "${CMAKE_SOURCE_DIR}/src")
    target_link_libraries(${name} PRIVATE ${arg_LINKS})
    set_target_properties(${name} PROPERTIES
        PREFIX ""
        LIBRARY_OUTPUT_DIRECTORY "${CMAKE_RUNTIME_OUTPUT_DIRECTORY}/plugins"
        CXX_VISIBILITY_PRESET hidden
        INSTALL_RPATH "$ORIGIN/../..")
    install(TARGETS ${name} LIBRARY DESTINATION lib/panoramic/bin/plugins)
endfunction()
