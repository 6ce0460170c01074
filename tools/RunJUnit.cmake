# Runs a JUnit 5 suite in a JVM with -Xcheck:jni and fails when a test fails or when the JVM
# reports a JNI warning or error. Like java/RunJvmTests.cmake, except that a warning raised
# inside the JDK's own native code is tolerated (see below): the tools draw text into images,
# and the JDK's font rasteriser trips -Xcheck:jni by itself.
#   cmake -DJAVA=... -DJUNIT=<console launcher jar> -DCLASSPATH=<a:b:c> -DSCAN=<jar or dir>
#         [-DLIBRARY=<native library>] -P RunJUnit.cmake

foreach(var JAVA JUNIT CLASSPATH SCAN)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "RunJUnit.cmake: ${var} is not set")
  endif()
endforeach()

set(jvm_args -Xcheck:jni -Djava.awt.headless=true)
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

if(NOT status EQUAL 0)
  message(FATAL_ERROR "JUnit failed (exit status ${status})")
endif()
# -Xcheck:jni reports misuse as a line such as "WARNING in native method: ..." followed by the
# Java stack, without failing the run: such a warning fails the test. The one exception is a
# warning raised inside the JDK's own native code (its first stack frame lies in a JDK module,
# e.g. "(java.desktop@17.0.15/Native Method)" for the font rasteriser that draws the report's
# labels): it is printed as ignored, since no code of this project is involved.
string(REPLACE ";" "," flat "${output}")
string(REGEX MATCHALL "WARNING[^\n]*\n?[^\n]*" warnings "${flat}")
set(ignored 0)
foreach(w IN LISTS warnings)
  if(w MATCHES "\n[ \t]*at [^\n]*[(](java|jdk)[.][a-z.]+@[0-9][^/]*/")
    math(EXPR ignored "${ignored} + 1")
  else()
    message(FATAL_ERROR "JVM warning: ${w}")
  endif()
endforeach()
if(ignored GREATER 0)
  message("RunJUnit: ignored ${ignored} JNI warning(s) raised inside the JDK's own native code")
endif()
if(output MATCHES "FATAL ERROR in native method[^\n]*")
  message(FATAL_ERROR "${CMAKE_MATCH_0}")
endif()
