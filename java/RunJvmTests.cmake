# Runs a JUnit 5 suite in a JVM with -Xcheck:jni and fails when a test fails or when the JVM
# reports any JNI misuse (lines with "WARNING" from -Xcheck:jni, or a fatal JNI error).
#   cmake -DJAVA=java -DCLASSPATH=a.jar:b.jar -DTEST_JAR=tests.jar "-DJVM_ARGS=-Dx=y;..."
#         [-DLAUNCHER_ARGS=...] -P RunJvmTests.cmake
# CLASSPATH holds everything the tests need (JUnit's console launcher included); the tests are
# discovered in TEST_JAR, or as LAUNCHER_ARGS select them.

foreach(var JAVA CLASSPATH TEST_JAR)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "RunJvmTests: ${var} is not set")
  endif()
endforeach()
if(NOT DEFINED LAUNCHER_ARGS)
  set(LAUNCHER_ARGS --scan-classpath "${TEST_JAR}")
endif()

execute_process(
  COMMAND "${JAVA}" -Xcheck:jni ${JVM_ARGS} -cp "${CLASSPATH}"
          org.junit.platform.console.ConsoleLauncher --disable-banner --disable-ansi-colors --details=tree
          --fail-if-no-tests ${LAUNCHER_ARGS}
  OUTPUT_VARIABLE out
  ERROR_VARIABLE err
  ECHO_OUTPUT_VARIABLE
  ECHO_ERROR_VARIABLE
  RESULT_VARIABLE result)

set(all "${out}\n${err}")
if(all MATCHES "WARNING[^\n]*")
  message(FATAL_ERROR "RunJvmTests: the JVM reported a JNI problem: ${CMAKE_MATCH_0}")
endif()
if(all MATCHES "FATAL ERROR in native method[^\n]*")
  message(FATAL_ERROR "RunJvmTests: ${CMAKE_MATCH_0}")
endif()
if(NOT result EQUAL 0)
  message(FATAL_ERROR "RunJvmTests: the suite failed (exit code ${result})")
endif()
