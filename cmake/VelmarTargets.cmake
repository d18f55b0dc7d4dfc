# velmar_library(NAME DIR [DEPENDS targets...])
# One static library per folder: every .cpp directly in DIR, and in its subfolders unless a subfolder is a
# library of its own (core/platform is separate from core). Headers are included from the project root.
function(velmar_library name dir)
    cmake_parse_arguments(ARG "" "" "DEPENDS;EXCLUDE" ${ARGN})
    if(dir STREQUAL "core")
        file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${dir}/*.cpp)
    else()
        file(GLOB_RECURSE sources CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${dir}/*.cpp)
    endif()
    add_library(${name} STATIC ${sources})
    target_include_directories(${name} PUBLIC ${CMAKE_SOURCE_DIR} ${CMAKE_BINARY_DIR}/generated)
    target_link_libraries(${name} PUBLIC ${ARG_DEPENDS})
endfunction()
