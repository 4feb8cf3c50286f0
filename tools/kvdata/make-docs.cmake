# Makes the man page and the bash completion of kvdata from the command's own
# help, when the command is built:
#   cmake -DKVDATA=bin/kvdata -DHELP2MAN=/usr/bin/help2man -DTEMPLATE=completion.bash.in
#         -DMAN=kvdata.1 -DCOMPLETION=kvdata -P make-docs.cmake
function(run_kvdata out)
  execute_process(COMMAND ${KVDATA} ${ARGN} OUTPUT_VARIABLE text RESULT_VARIABLE rc)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "kvdata ${ARGN} failed (${rc})")
  endif()
  set(${out} "${text}" PARENT_SCOPE)
endfunction()

# One line per command: its name ("kvdata" itself first) and the words after it.
run_kvdata(words --completion-words)
string(REPLACE "\n" ";" lines "${words}")
set(cases "")
set(subcommands "")
foreach(line IN LISTS lines)
  if(line STREQUAL "")
    continue()
  endif()
  string(FIND "${line}" " " space)
  string(SUBSTRING "${line}" 0 ${space} name)
  math(EXPR rest_at "${space} + 1")
  string(SUBSTRING "${line}" ${rest_at} -1 rest)
  if(name STREQUAL "kvdata")
    set(pattern "\"\"")
  else()
    set(pattern "${name}")
    list(APPEND subcommands ${name})
  endif()
  string(APPEND cases "    ${pattern}) words=\"${rest}\" ;;\n")
endforeach()
string(REGEX REPLACE "\n$" "" KVDATA_COMPLETION_CASES "${cases}")
configure_file(${TEMPLATE} ${COMPLETION} @ONLY)

# The man page: help2man reads `kvdata --help` and `--version`; each
# subcommand's help follows as a section of its own.
run_kvdata(top --help)
string(REGEX MATCH "^[^\n]*" first "${top}")
string(REGEX REPLACE "^kvdata: " "" description "${first}")
set(include "[SUBCOMMANDS]\n")
foreach(sub IN LISTS subcommands)
  run_kvdata(help help ${sub})
  string(REPLACE "\\" "\\e" help "${help}")
  string(REGEX REPLACE "\n([.'])" "\n\\\\&\\1" help "\n${help}")
  string(APPEND include ".SS ${sub}\n.nf${help}.fi\n")
endforeach()
get_filename_component(dir ${MAN} DIRECTORY)
file(WRITE ${dir}/kvdata-subcommands.h2m "${include}")
execute_process(
  COMMAND ${HELP2MAN} --no-info --no-discard-stderr --name=${description}
          --include=${dir}/kvdata-subcommands.h2m --output=${MAN} ${KVDATA}
  RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "help2man failed (${rc})")
endif()
