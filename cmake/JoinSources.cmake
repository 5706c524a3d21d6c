# Compiles the sources of libraries several at a time, those that define no name twice; a source whose names change
# configures the build anew.

function(morvik_join_sources library)
    get_target_property(folder ${library} SOURCE_DIR)
    get_target_property(sources ${library} SOURCES)
    list(FILTER sources INCLUDE REGEX "^[^/].*\\.cpp$")
    set(paths ${sources})
    list(TRANSFORM paths PREPEND ${folder}/)
    execute_process(
        COMMAND ${PROJECT_SOURCE_DIR}/scripts/join-sources ${paths}
        OUTPUT_VARIABLE units OUTPUT_STRIP_TRAILING_WHITESPACE
        COMMAND_ERROR_IS_FATAL ANY)
    foreach(source unit IN ZIP_LISTS paths units)
        set_source_files_properties(${source} TARGET_DIRECTORY ${library} PROPERTIES UNITY_GROUP unit_${unit})
    endforeach()
    set_target_properties(${library} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
    set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${paths})
endfunction()

# Joins the sources of each static library of folders and the folders below.
function(morvik_join_libraries_of)
    foreach(folder IN LISTS ARGN)
        get_property(libraries DIRECTORY ${folder} PROPERTY BUILDSYSTEM_TARGETS)
        foreach(library IN LISTS libraries)
            get_target_property(type ${library} TYPE)
            if(type STREQUAL STATIC_LIBRARY)
                morvik_join_sources(${library})
            endif()
        endforeach()
        get_property(below DIRECTORY ${folder} PROPERTY SUBDIRECTORIES)
        morvik_join_libraries_of(${below})
    endforeach()
endfunction()
