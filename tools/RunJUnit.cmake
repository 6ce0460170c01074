# Runs a JUnit 5 suite in a JVM with -Xcheck:jni and fails when a test fails or when the JVM
# reports any JNI warning or error, wherever it comes from (our library or the JDK's own native
# code: the tools draw their text with a built-in pixel font, so nothing of theirs should enter
# the JDK's font code either).
#   cmake -DJAVA=... -DJUNIT=<console launcher jar> -DCLASSPATH=<a:b:c> -DSCAN=<jar or dir>
#         [-DLIBRARY=<native library>] [-DJVM_ARGS=<a;b>] -P RunJUnit.cmake

foreach(var JAVA JUNIT CLASSPATH SCAN)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "RunJUnit.cmake: ${var} is not set")
  endif()
endforeach()

set(jvm_args -Xcheck:jni -Djava.awt.headless=true ${JVM_ARGS})
if(DEFINED LIBRARY)
  list(APPEND jvm_args -Dorzavs.library.path=${LIBRARY})
endif()

execute_process(
  COMMAND ${JAVA} ${jvm_args} -jar ${JUNIT}
          --class-path ${CLASSPATH} --scan-class-path ${SCAN}
          --disable-banner --disable-ansi-colors --details=tree --fail-if-no-tests
  RESULT_VARIABLE status
  OUTPUT_VARIABLE output
  ERROR_VARIABLE output)
message("${output}")

# -Xcheck:jni reports misuse as a line such as "WARNING in native method: ..." followed by the
# Java stack, without failing the run; a fatal misuse ends the JVM with "FATAL ERROR in native
# method". Either fails the test, with the count and the first one shown.
string(REGEX MATCHALL "WARNING in native method[^\n]*" warnings "${output}")
list(LENGTH warnings count)
if(count GREATER 0)
  list(GET warnings 0 first)
  message(FATAL_ERROR "RunJUnit: the JVM reported ${count} JNI warning(s); the first: ${first}")
endif()
if(output MATCHES "WARNING[^\n]*")
  message(FATAL_ERROR "RunJUnit: the JVM reported a warning: ${CMAKE_MATCH_0}")
endif()
if(output MATCHES "FATAL ERROR in native method[^\n]*")
  message(FATAL_ERROR "RunJUnit: ${CMAKE_MATCH_0}")
endif()
if(NOT status EQUAL 0)
  message(FATAL_ERROR "RunJUnit: JUnit failed (exit status ${status})")
endif()
message("RunJUnit: no JNI warnings")
