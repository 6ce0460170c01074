# Runs the soak in a JVM with -Xcheck:jni and fails when the soak reports a failure or when the
# JVM reports any JNI warning or error. The whole output (the library's own lines included) goes
# to LOG; the soak's figures and every JVM warning are echoed.
#   cmake -DJAVA=... -DCLASSPATH=<a:b> -DLIBRARY=<libOrzaVSMobile.so> -DSECONDS=N -DLOG=<file>
#         -P RunSoak.cmake

foreach(var JAVA CLASSPATH LIBRARY SECONDS LOG)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "RunSoak.cmake: ${var} is not set")
  endif()
endforeach()

message("RunSoak: ${SECONDS} s")

execute_process(
  COMMAND ${JAVA} -Xcheck:jni -Xmx256m -XX:NativeMemoryTracking=summary
          -Dorzavs.library.path=${LIBRARY} -cp ${CLASSPATH}
          com.orza.vs.tools.soak.Soak --seconds ${SECONDS}
  RESULT_VARIABLE status
  OUTPUT_VARIABLE out
  ERROR_VARIABLE err)
# The library's own lines are on standard output, the soak's report on standard error.
file(WRITE ${LOG} "--- standard output\n${out}\n--- standard error\n${err}")

set(all "${out}\n${err}")
string(REPLACE ";" "<semicolon>" all "${all}")
string(REGEX MATCHALL "[^\n]*(soak:|WARNING|FATAL ERROR|Exception)[^\n]*" lines "${all}")
foreach(line IN LISTS lines)
  string(REPLACE "<semicolon>" ";" line "${line}")
  message("${line}")
endforeach()
message("RunSoak: full output in ${LOG}")

if(all MATCHES "WARNING in native method|JNI local refs|FATAL ERROR in native method")
  message(FATAL_ERROR "RunSoak: the JVM reported JNI misuse (see above)")
endif()
if(NOT status EQUAL 0)
  message(FATAL_ERROR "RunSoak: the soak failed (exit status ${status})")
endif()
