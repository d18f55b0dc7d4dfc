# Run by CPack after it has installed the project into its staging directory, before it builds the package:
# removes the .comment and .note sections from the programs (CPACK_STRIP_FILES has taken the symbols).
file(GLOB programs "${CPACK_TEMPORARY_INSTALL_DIRECTORY}/usr/bin/*")
if(NOT programs)
    message(FATAL_ERROR "no programs in ${CPACK_TEMPORARY_INSTALL_DIRECTORY}/usr/bin")
endif()
foreach(program IN LISTS programs)
    execute_process(COMMAND "${CPACK_VELMAR_STRIP}" --remove-section=.comment --remove-section=.note "${program}"
                    RESULT_VARIABLE status)
    if(NOT status EQUAL 0)
        message(FATAL_ERROR "${CPACK_VELMAR_STRIP} failed on ${program}")
    endif()
endforeach()
