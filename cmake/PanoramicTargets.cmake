# How the targets of this tree are made, so that each CMakeLists.txt says only what it holds and what it links.

find_program(PANORAMIC_CCACHE ccache)
if(PANORAMIC_CCACHE)
    # Precompiled headers are cached only when ccache may overlook their timestamps. What one clone of the tree has
    # compiled serves another one in another folder.
    set(CMAKE_CXX_COMPILER_LAUNCHER "${CMAKE_COMMAND};-E;env;CCACHE_SLOPPINESS=pch_defines,time_macros"
        "CCACHE_BASEDIR=${CMAKE_SOURCE_DIR}" CCACHE_NOHASHDIR=1 "${PANORAMIC_CCACHE}")
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

# panoramic_headers(TARGET SCOPE PREFIX [FOLDER]): lets TARGET, and by SCOPE those that link it, write
# #include "PREFIX/..." for the headers of FOLDER (this one unless told). Each target has an include folder of its own
# with nothing but that prefix in it, so a header of a target that isn't linked is not found: the directions that
# docs/architecture.md draws hold, or the build fails.
function(panoramic_headers target scope prefix)
    set(folder "${CMAKE_CURRENT_SOURCE_DIR}")
    if(ARGC GREATER 3)
        set(folder "${ARGV3}")
    endif()
    set(root "${CMAKE_BINARY_DIR}/headers/${target}")
    get_filename_component(above "${root}/${prefix}" DIRECTORY)
    file(MAKE_DIRECTORY "${above}")
    file(CREATE_LINK "${folder}" "${root}/${prefix}" SYMBOLIC)
    target_include_directories(${target} ${scope} "${root}")
    if(NOT scope STREQUAL "PRIVATE")
        set_property(GLOBAL APPEND PROPERTY panoramic_folders "${target}|${prefix}|${folder}")
    endif()
endfunction()

# panoramic_test_directions(): a test that no folder sees a header of one that is added after it, for the folders that
# panoramic_headers has been told of. To be called last.
function(panoramic_test_directions)
    get_property(folders GLOBAL PROPERTY panoramic_folders)
    set(lines "")
    foreach(folder IN LISTS folders)
        string(REGEX REPLACE "[|].*" "" target "${folder}")
        get_target_property(type ${target} TYPE)
        set(property INCLUDE_DIRECTORIES)
        if(type STREQUAL INTERFACE_LIBRARY)
            set(property INTERFACE_INCLUDE_DIRECTORIES)
        endif()
        string(APPEND lines "${folder}|$<JOIN:$<TARGET_PROPERTY:${target},${property}>,|>\n")
    endforeach()
    file(GENERATE OUTPUT "${CMAKE_BINARY_DIR}/directions.txt" CONTENT "${lines}")
    add_test(NAME directions_tests
        COMMAND python3 "${CMAKE_SOURCE_DIR}/tests/directions.py" "${CMAKE_BINARY_DIR}/directions.txt" "${CMAKE_CXX_COMPILER}")
endfunction()

# Several sources of a library or program are compiled as one: most of a source's time goes into the headers of the scene
# graph library, and what those instantiate comes once for all. Tests stay apart, for they change one by one.
function(panoramic_unite_sources target)
    if(PANORAMIC_UNITY)
        set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_BATCH_SIZE 8)
        target_compile_options(${target} PRIVATE -Wshadow=local)
    endif()
endfunction()

# panoramic_library(NAME PREFIX scene SOURCES a.cpp ... LINKS lower ...): a static library whose headers are seen under
# PREFIX by itself and by those that link it.
function(panoramic_library name)
    cmake_parse_arguments(arg "" "PREFIX" "SOURCES;LINKS" ${ARGN})
    add_library(${name} STATIC ${arg_SOURCES})
    panoramic_headers(${name} PUBLIC ${arg_PREFIX})
    target_link_libraries(${name} PUBLIC ${arg_LINKS})
    panoramic_unite_sources(${name})
endfunction()

# panoramic_test(NAME SOURCES a.cpp ... LINKS lib ...): one test program, one ctest entry.
function(panoramic_test name)
    cmake_parse_arguments(arg "" "TIMEOUT" "SOURCES;LINKS" ${ARGN})
    if(NOT arg_TIMEOUT)
        set(arg_TIMEOUT 300)
    endif()
    add_executable(${name} ${arg_SOURCES})
    target_link_libraries(${name} PRIVATE ${arg_LINKS} GTest::gtest GTest::gmock GTest::gtest_main)
    # Beside the programs, so that what looks for plugins/ and Assets/ next to itself finds them.
    add_test(NAME ${name} COMMAND ${name})
    set_tests_properties(${name} PROPERTIES TIMEOUT ${arg_TIMEOUT})
endfunction()

# panoramic_plugin(NAME SOURCES a.cpp ... LINKS lib ...): a module in plugins/ beside the programs.
function(panoramic_plugin name)
    cmake_parse_arguments(arg "" "" "SOURCES;LINKS" ${ARGN})
    add_library(${name} MODULE ${arg_SOURCES})
    target_link_libraries(${name} PRIVATE ${arg_LINKS})
    set_target_properties(${name} PROPERTIES
        PREFIX ""
        LIBRARY_OUTPUT_DIRECTORY "${CMAKE_RUNTIME_OUTPUT_DIRECTORY}/plugins"
        CXX_VISIBILITY_PRESET hidden
        INSTALL_RPATH "$ORIGIN/../..")
    install(TARGETS ${name} LIBRARY DESTINATION lib/panoramic/bin/plugins)
endfunction()
