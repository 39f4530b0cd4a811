# Writes a help2man include file: the fixed sections of INCLUDE, then a COMMANDS section with
# the --help of every subcommand that PROGRAM's own --help lists under "Subcommands:".
#   cmake -DPROGRAM=path -DINCLUDE=file.h2m -DOUTPUT=out.h2m -P SubcommandHelp.cmake
foreach(variable PROGRAM INCLUDE OUTPUT)
  if(NOT DEFINED ${variable})
    message(FATAL_ERROR "SubcommandHelp.cmake: ${variable} is not set")
  endif()
endforeach()

execute_process(COMMAND "${PROGRAM}" --help OUTPUT_VARIABLE help RESULT_VARIABLE status
                TIMEOUT 30)
if(NOT status EQUAL 0)
  message(FATAL_ERROR "${PROGRAM} --help failed: ${status}")
endif()

# The subcommand names: the first word of each indented line after "Subcommands:".
string(REPLACE "\n" ";" lines "${help}")
set(names)
set(in_list FALSE)
foreach(line IN LISTS lines)
  if(line MATCHES "^Subcommands:")
    set(in_list TRUE)
  elseif(in_list AND line MATCHES "^  +([a-z][a-z0-9-]*)")
    list(APPEND names "${CMAKE_MATCH_1}")
  elseif(in_list AND NOT line MATCHES "^ ")
    set(in_list FALSE)
  endif()
endforeach()
if(NOT names)
  message(FATAL_ERROR "${PROGRAM} --help lists no subcommands")
endif()

file(READ "${INCLUDE}" text)
string(APPEND text "[COMMANDS]\n")
get_filename_component(program_name "${PROGRAM}" NAME)
foreach(name IN LISTS names)
  execute_process(COMMAND "${PROGRAM}" ${name} --help OUTPUT_VARIABLE sub_help
                  RESULT_VARIABLE status TIMEOUT 30)
  if(NOT status EQUAL 0)
    message(FATAL_ERROR "${PROGRAM} ${name} --help failed: ${status}")
  endif()
  # Shown as written: backslashes escaped, no line read as a roff request.
  string(REPLACE "\\" "\\e" sub_help "${sub_help}")
  string(REGEX REPLACE "(^|\n)([.'])" "\\1\\\\&\\2" sub_help "${sub_help}")
  string(APPEND text ".SS \"${program_name} ${name}\"\n.nf\n${sub_help}.fi\n")
endforeach()
file(WRITE "${OUTPUT}" "${text}")
