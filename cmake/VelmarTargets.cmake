# velmar_include_view(TARGET SCOPE FOLDER...): puts the source folders FOLDER... (paths from the project root,
# such as core/platform) on TARGET's include path, and nothing else of the tree. Headers are included by their
# path from the project root ("logfile/DlfFile.h"), so the path is a directory of symbolic links that holds
# those folders at their places; a target sees its own folders and those of the libraries it links. A
# header of a folder that a target may not use is thus not found: the include fails to compile, not only
# to link.
function(velmar_include_view target scope)
    set(view ${CMAKE_BINARY_DIR}/include-views/${target})
    foreach(folder ${ARGN})
        get_filename_component(parent ${view}/${folder} DIRECTORY)
        file(MAKE_DIRECTORY ${parent})
        file(CREATE_LINK ${CMAKE_SOURCE_DIR}/${folder} ${view}/${folder} SYMBOLIC)
    endforeach()
    target_include_directories(${target} ${scope} ${view})
endfunction()

# velmar_library(NAME DIR [DEPENDS targets...])
# One static library per folder: every .cpp directly in DIR, and in its subfolders unless a subfolder is a
# library of its own (core/platform is separate from core). The library and its dependents see DIR.
function(velmar_library name dir)
    cmake_parse_arguments(ARG "" "" "DEPENDS;EXCLUDE" ${ARGN})
    if(dir STREQUAL "core")
        file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${dir}/*.cpp)
    else()
        file(GLOB_RECURSE sources CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${dir}/*.cpp)
    endif()
    add_library(${name} STATIC ${sources})
    velmar_include_view(${name} PUBLIC ${dir})
    target_link_libraries(${name} PUBLIC ${ARG_DEPENDS})
endfunction()
