# orvane_layer(NAME SOURCES... [USES layers...] [LIBRARIES targets...] [HEADERS headers...])
#
# One OBJECT library per layer, orvane_NAME. USES names the layers below that it may call,
# LIBRARIES what it needs from outside, HEADERS what is precompiled. A check target,
# orvane_NAME_links, links the layer against exactly those with nothing left undefined, so that a
# call upwards does not link.

set_property(GLOBAL PROPERTY ORVANE_LAYERS "")

function(orvane_layer name)
    cmake_parse_arguments(LAYER "" "" "SOURCES;USES;LIBRARIES;HEADERS" ${ARGN})
    set(target orvane_${name})

    add_library(${target}_needs INTERFACE)
    target_include_directories(${target}_needs INTERFACE ${PROJECT_SOURCE_DIR}/Source
                                                         ${PROJECT_SOURCE_DIR}/Include)
    target_link_libraries(${target}_needs INTERFACE ${LAYER_LIBRARIES})

    add_library(${target} OBJECT ${LAYER_SOURCES})
    set(objects $<TARGET_OBJECTS:${target}>)
    foreach(lower IN LISTS LAYER_USES)
        list(APPEND objects $<TARGET_OBJECTS:orvane_${lower}>)
        target_link_libraries(${target}_needs INTERFACE orvane_${lower}_needs)
    endforeach()
    target_link_libraries(${target} PRIVATE orvane_options PUBLIC ${target}_needs)
    if(LAYER_HEADERS)
        target_precompile_headers(${target} PRIVATE ${LAYER_HEADERS})
    endif()

    add_library(${target}_links SHARED ${objects})
    target_link_libraries(${target}_links PRIVATE orvane_options ${target}_needs)
    set_target_properties(${target}_links PROPERTIES LINKER_LANGUAGE CXX)
    if(NOT ORVANE_SANITIZERS)
        target_link_options(${target}_links PRIVATE -Wl,-z,defs)
    endif()

    set_property(GLOBAL APPEND PROPERTY ORVANE_LAYERS ${name})
endfunction()

# orvane_whole(TARGET KIND): a library of the given kind from the objects of every layer.
function(orvane_whole target kind)
    get_property(layers GLOBAL PROPERTY ORVANE_LAYERS)
    add_library(${target} ${kind})
    foreach(layer IN LISTS layers)
        target_sources(${target} PRIVATE $<TARGET_OBJECTS:orvane_${layer}>)
        if(kind STREQUAL STATIC)
            target_link_libraries(${target} PUBLIC orvane_${layer}_needs)
        else()
            target_link_libraries(${target} PRIVATE orvane_${layer}_needs)
        endif()
    endforeach()
    target_include_directories(${target} PUBLIC ${PROJECT_SOURCE_DIR}/Include)
    set_target_properties(${target} PROPERTIES LINKER_LANGUAGE CXX)
endfunction()
