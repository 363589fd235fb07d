# Prints what the provider takes on a host's disk.
execute_process(COMMAND ${STRIP} -o ${LIBRARY}.stripped ${LIBRARY} COMMAND_ERROR_IS_FATAL ANY)
file(SIZE ${LIBRARY}.stripped size)
file(REMOVE ${LIBRARY}.stripped)
get_filename_component(name ${LIBRARY} NAME)
message(STATUS "${name}: ${size} bytes stripped")
