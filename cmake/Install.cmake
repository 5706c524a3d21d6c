# The layout of `cmake --install`: the libraries with their headers, CMake packages and pkg-config files, the command with
# its manual pages and completions, and the pages of docs/. All paths are relative, so an installed tree can be moved. If
# only the model is built, `cmake --install FOLDER --component library` installs it alone; so do `link` with the LTE
# chain and `checker`. packaging/ has Debian's layout.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)
set(library morvik_v1_0_bitacc_cmodel)

set(CMAKE_INSTALL_DEFAULT_COMPONENT_NAME library)
set_target_properties(morvik_classes PROPERTIES EXPORT_NAME classes)
install(TARGETS ${library} morvik_classes EXPORT ${library}
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
    INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(DIRECTORY include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} FILES_MATCHING PATTERN *.h PATTERN morvik_link.h EXCLUDE
    PATTERN morvik_checker.h EXCLUDE PATTERN morvik_units.h EXCLUDE)
install(FILES LICENSE DESTINATION ${CMAKE_INSTALL_DOCDIR})

# The class headers and those that they include. Their names are common, so they have a folder of their own.
set(classes_dir ${CMAKE_INSTALL_INCLUDEDIR}/morvik_v1_0_classes)
set(MORVIK_CLASS_HEADERS
    Misc.h
    T8.h
    TCalculationEngine.h
    TCalculationEngineMod.h
    TCalculationEngineModBase.h
    TCalculationEngineModHash.h
    TDecoder.h
    TDecoder3G.h
    TDecoder3GPU.h
    TInterleaver.h
    TInterleaver3GPPLTE.h
    TNumberFormat.h)
list(TRANSFORM MORVIK_CLASS_HEADERS PREPEND ${PROJECT_SOURCE_DIR}/src/)
install(FILES ${MORVIK_CLASS_HEADERS} DESTINATION ${classes_dir})
install(DIRECTORY rules DESTINATION ${classes_dir} FILES_MATCHING PATTERN *.h)
target_include_directories(morvik_classes INTERFACE $<INSTALL_INTERFACE:${classes_dir}>)

set(commands morvik)
if(TARGET morvik-mpi)
    list(APPEND commands morvik-mpi)
endif()
file(RELATIVE_PATH to_libraries ${CMAKE_INSTALL_FULL_BINDIR} ${CMAKE_INSTALL_FULL_LIBDIR})
# The build's library is in ../lib, so that installation need not rewrite the command.
set(runtime_path "$ORIGIN/${to_libraries}" "$ORIGIN/../lib")
list(REMOVE_DUPLICATES runtime_path)
if(NOT MORVIK_STATIC_COMMAND)
    set_target_properties(${commands} PROPERTIES INSTALL_RPATH "${runtime_path}" BUILD_WITH_INSTALL_RPATH ON)
endif()
install(TARGETS ${commands} RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT command)

# Manual pages, completions, and the documents that they refer to.
foreach(command IN LISTS commands)
    if(NOT MORVIK_REFERENCE_DIR)
        break()
    endif()
    install(DIRECTORY ${MORVIK_REFERENCE_DIR}/${command}/share/ DESTINATION ${CMAKE_INSTALL_DATADIR} COMPONENT command)
endforeach()
install(DIRECTORY docs DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT documents
    FILES_MATCHING PATTERN *.md PATTERN *.svg PATTERN *.png PATTERN trace.gtkw PATTERN site EXCLUDE)

set_target_properties(morvik_link_c PROPERTIES EXPORT_NAME morvik_link)
install(TARGETS morvik_link_c EXPORT morvik_link
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT link
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT link
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT link
    INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(FILES include/morvik_link.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT link)

set_target_properties(morvik_checker_c PROPERTIES EXPORT_NAME morvik_checker)
install(TARGETS morvik_checker_c EXPORT morvik_checker
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT checker
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT checker
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT checker
    INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(FILES include/morvik_checker.h include/morvik_units.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT checker)

# On Windows, other compilers make their own import libraries, of the lists of exports.
if(WIN32)
    install(FILES src/exports.def DESTINATION ${CMAKE_INSTALL_LIBDIR} RENAME ${library}.def)
    install(FILES link/exports.def DESTINATION ${CMAKE_INSTALL_LIBDIR} RENAME morvik_link.def COMPONENT link)
    install(FILES hardware/checker/exports.def DESTINATION ${CMAKE_INSTALL_LIBDIR} RENAME morvik_checker.def
        COMPONENT checker)
endif()

# What finds a library: a CMake package and a pkg-config file. A consumer of the other word size gets a message rather
# than a linker error.
cmake_path(RELATIVE_PATH CMAKE_INSTALL_PREFIX BASE_DIRECTORY ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig
    OUTPUT_VARIABLE pc_to_prefix)
function(install_finders name component)
    install(EXPORT ${name} NAMESPACE morvik:: FILE ${name}Config.cmake
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/${name} COMPONENT ${component})
    write_basic_package_version_file(${PROJECT_BINARY_DIR}/${name}ConfigVersion.cmake COMPATIBILITY SameMajorVersion)
    install(FILES ${PROJECT_BINARY_DIR}/${name}ConfigVersion.cmake
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/${name} COMPONENT ${component})
    configure_file(cmake/${name}.pc.in ${PROJECT_BINARY_DIR}/${name}.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/${name}.pc
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT ${component})
endfunction()
install_finders(${library} library)
install_finders(morvik_link link)
install_finders(morvik_checker checker)
