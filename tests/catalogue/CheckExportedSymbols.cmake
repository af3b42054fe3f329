# Checks that the catalogue tables are exported from the shared library under their plain names.
# Usage: cmake -DNM=<nm> -DLIBRARY=<libtarnstats.so> -P CheckExportedSymbols.cmake
execute_process(COMMAND ${NM} -D --defined-only ${LIBRARY}
                OUTPUT_VARIABLE symbols RESULT_VARIABLE result ERROR_VARIABLE errors)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "${NM} failed on ${LIBRARY}: ${errors}")
endif()
set(missing "")
foreach(name statIdMax statIdMap statAttributeIdMax statSetIdMax statSetStatInfoIdMax
             statSetStatInfoTab statMetadataTab statAttributesTab statSetTab)
  # "<address> <type> <name>", the name unmangled, ending the line.
  if(NOT symbols MATCHES "[0-9a-fA-F]+ [A-Za-z] ${name}(\n|$)")
    list(APPEND missing ${name})
  endif()
endforeach()
if(missing)
  message(FATAL_ERROR "not exported from ${LIBRARY}: ${missing}")
endif()
message(STATUS "all catalogue tables exported")
