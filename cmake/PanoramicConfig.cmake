# find_package(Panoramic): the data point library, for modules that are built outside (docs/plugins.md).
get_filename_component(PANORAMIC_PREFIX "${CMAKE_CURRENT_LIST_DIR}/../../.." ABSOLUTE)

if(NOT TARGET Panoramic::DataPoints)
    add_library(Panoramic::DataPoints SHARED IMPORTED)
    set_target_properties(Panoramic::DataPoints PROPERTIES
        IMPORTED_LOCATION "${PANORAMIC_PREFIX}/lib/panoramic/libSimulationDataPointsBaseU.so"
        INTERFACE_INCLUDE_DIRECTORIES "${PANORAMIC_PREFIX}/include/panoramic"
        INTERFACE_COMPILE_FEATURES cxx_std_20)
endif()

# panoramic_data_point(KIND source...): the module of a kind, by the table of the installed headers.
function(panoramic_data_point kind)
    file(STRINGS "${PANORAMIC_PREFIX}/include/panoramic/simdata/points/DataPointKinds.h" rows REGEX "L\"[A-Za-z]+\"")
    list(TRANSFORM rows REPLACE ".*L\"([A-Za-z]+)\".*" "\\1" OUTPUT_VARIABLE kinds)
    if(NOT kind IN_LIST kinds)
        list(JOIN kinds ", " kinds)
        message(FATAL_ERROR "There is no kind of data points \"${kind}\". There are: ${kinds}")
    endif()
    set(module "SimulationDataPoint${kind}U")
    add_library(${module} MODULE ${ARGN})
    target_link_libraries(${module} PRIVATE Panoramic::DataPoints)
    set_target_properties(${module} PROPERTIES PREFIX "" CXX_VISIBILITY_PRESET hidden)
endfunction()
