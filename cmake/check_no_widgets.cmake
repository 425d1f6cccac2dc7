# cmake -DBINARY=<file> -P check_no_widgets.cmake
# Fails when the binary needs a GUI library: the headless programs must run
# on a machine without a display.
execute_process(COMMAND readelf -d ${BINARY} OUTPUT_VARIABLE dyn RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "cannot read ${BINARY}")
endif()
string(REGEX MATCHALL "NEEDED[^\n]*" needed "${dyn}")
foreach(line IN LISTS needed)
  if(line MATCHES "Qt6Widgets|Qt6Gui|Qt6PrintSupport|qcustomplot")
    message(FATAL_ERROR "${BINARY} links a GUI library: ${line}")
  endif()
endforeach()
message(STATUS "${BINARY}: no GUI libraries")
