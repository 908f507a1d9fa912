# Fails when a committed text that produces or shows the pictures (README, SCRIPTING.md, the man pages,
# the demo scripts, the help pages) names an absolute path of a build machine: the source or build folder of this build,
# or a home, work or temporary folder. Run as: cmake -DSOURCE=<dir> -DBINARY=<dir> -P nobuildpaths.cmake
file(GLOB_RECURSE texts RELATIVE "${SOURCE}"
  "${SOURCE}/*.md" "${SOURCE}/scripts/*" "${SOURCE}/apps/*.1" "${SOURCE}/*.qis" "${SOURCE}/help/*")
list(FILTER texts EXCLUDE REGEX "^(build|\\.git)")
set(failures "")
foreach(text IN LISTS texts)
  file(STRINGS "${SOURCE}/${text}" lines)
  set(number 0)
  foreach(line IN LISTS lines)
    math(EXPR number "${number} + 1")
    string(FIND "${line}" "${SOURCE}/" inSource)
    string(FIND "${line}" "${BINARY}" inBinary)
    if(inSource GREATER -1 OR inBinary GREATER -1
       OR line MATCHES "(^|[ \t\"'(=:`])/(home|work|root|tmp|var/tmp|build)/[A-Za-z0-9_.-]+/")
      string(APPEND failures "${text}:${number}: ${line}\n")
    endif()
  endforeach()
endforeach()
if(failures)
  message(FATAL_ERROR "Absolute paths of a build machine in committed texts:\n${failures}")
endif()
list(LENGTH texts count)
message(STATUS "${count} texts checked, no absolute build paths")
