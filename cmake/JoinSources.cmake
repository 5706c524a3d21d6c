# Compiles the sources of libraries and programs several at a time, those that define no name twice; a source whose names
# change configures the build anew.

# Joins the sources of each of some libraries and programs.
function(morvik_join_sources)
    set(paths)
    set(joined)
    foreach(target IN LISTS ARGN)
        get_target_property(folder ${target} SOURCE_DIR)
        get_target_property(sources ${target} SOURCES)
        list(FILTER sources INCLUDE REGEX "^[^/].*\\.cpp$")
        list(LENGTH sources count)
        if(count GREATER 1)
            list(TRANSFORM sources PREPEND ${folder}/)
            list(APPEND paths ${sources} --)
            list(APPEND joined ${target})
        endif()
    endforeach()
    # One start for all: it takes longer to start than to divide.
    execute_process(
        COMMAND ${PROJECT_SOURCE_DIR}/scripts/join-sources ${paths}
        OUTPUT_VARIABLE units OUTPUT_STRIP_TRAILING_WHITESPACE
        COMMAND_ERROR_IS_FATAL ANY)
    foreach(path unit IN ZIP_LISTS paths units)
        if(path STREQUAL "--")
            list(POP_FRONT joined target)
            set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
        else()
            list(GET joined 0 target)
            set_source_files_properties(${path} TARGET_DIRECTORY ${target} PROPERTIES UNITY_GROUP unit_${unit})
        endif()
    endforeach()
    list(REMOVE_ITEM paths --)
    set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS
        ${paths} ${PROJECT_SOURCE_DIR}/scripts/join-sources ${PROJECT_SOURCE_DIR}/scripts/source_units.py)
endfunction()

# Sets `found` to the libraries and programs of folders and the folders below.
function(morvik_targets_of found)
    set(all)
    foreach(folder IN LISTS ARGN)
        get_property(targets DIRECTORY ${folder} PROPERTY BUILDSYSTEM_TARGETS)
        foreach(target IN LISTS targets)
            get_target_property(type ${target} TYPE)
            if(type MATCHES "^(EXECUTABLE|(MODULE|OBJECT|SHARED|STATIC)_LIBRARY)$")
                list(APPEND all ${target})
            endif()
        endforeach()
        get_property(below DIRECTORY ${folder} PROPERTY SUBDIRECTORIES)
        morvik_targets_of(inner ${below})
        list(APPEND all ${inner})
    endforeach()
    set(${found} ${all} PARENT_SCOPE)
endfunction()
