# Compiles the sources of libraries and programs several at a time, those that define no name twice; a source whose names
# change configures the build anew.

function(morvik_join_sources target)
    get_target_property(folder ${target} SOURCE_DIR)
    get_target_property(sources ${target} SOURCES)
    list(FILTER sources INCLUDE REGEX "^[^/].*\\.cpp$")
    list(LENGTH sources count)
    if(count LESS 2)
        return()
    endif()
    set(paths ${sources})
    list(TRANSFORM paths PREPEND ${folder}/)
    execute_process(
        COMMAND ${PROJECT_SOURCE_DIR}/scripts/join-sources ${paths}
        OUTPUT_VARIABLE units OUTPUT_STRIP_TRAILING_WHITESPACE
        COMMAND_ERROR_IS_FATAL ANY)
    foreach(source unit IN ZIP_LISTS paths units)
        set_source_files_properties(${source} TARGET_DIRECTORY ${target} PROPERTIES UNITY_GROUP unit_${unit})
    endforeach()
    set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
    set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
        ${paths} ${PROJECT_SOURCE_DIR}/scripts/join-sources ${PROJECT_SOURCE_DIR}/scripts/source_units.py)
endfunction()

# Joins the sources of each library and program of folders and the folders below.
function(morvik_join_sources_of)
    foreach(folder IN LISTS ARGN)
        get_property(targets DIRECTORY ${folder} PROPERTY BUILDSYSTEM_TARGETS)
        foreach(target IN LISTS targets)
            get_target_property(type ${target} TYPE)
            if(type MATCHES "^(EXECUTABLE|(MODULE|OBJECT|SHARED|STATIC)_LIBRARY)$")
                morvik_join_sources(${target})
            endif()
        endforeach()
        get_property(below DIRECTORY ${folder} PROPERTY SUBDIRECTORIES)
        morvik_join_sources_of(${below})
    endforeach()
endfunction()
