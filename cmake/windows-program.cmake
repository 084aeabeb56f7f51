# Gives a program its manifest and its version, and leaves out what only a debugger reads, and the time of the build: the
# same sources give the same program. The linker's map tells what was linked in.
function(vexa_windows_program target description)
    set(PROGRAM_NAME ${target})
    set(PROGRAM_DESCRIPTION ${description})
    set(PROGRAM_MANIFEST ${PROJECT_SOURCE_DIR}/cmake/program.manifest)
    set(resource ${CMAKE_CURRENT_BINARY_DIR}/${target}.rc)
    configure_file(${PROJECT_SOURCE_DIR}/cmake/program.rc.in ${resource} @ONLY)
    set_source_files_properties(${resource} PROPERTIES OBJECT_DEPENDS ${PROGRAM_MANIFEST})
    target_sources(${target} PRIVATE ${resource})
    target_link_options(${target} PRIVATE -Wl,--no-insert-timestamp $<$<CONFIG:Release>:-s>
        -Wl,-Map,$<TARGET_FILE:${target}>.map)
endfunction()
