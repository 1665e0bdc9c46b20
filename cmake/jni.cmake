# jni.h for the Java bridge. It is plain C and depends on the compiler alone, so a cross build takes it
# from the JDK of the machine that builds; Android brings its own.
add_library(tavir_jni_headers INTERFACE)
if(NOT ANDROID)
  file(GLOB jdk_includes LIST_DIRECTORIES true /usr/lib/jvm/*/include)
  find_path(TAVIR_JNI_INCLUDE jni.h
            HINTS $ENV{JAVA_HOME}/include PATHS /usr/lib/jvm/default-java/include ${jdk_includes}
            NO_CMAKE_FIND_ROOT_PATH DOC "Folder of the JDK's jni.h")
  if(NOT TAVIR_JNI_INCLUDE)
    message(FATAL_ERROR "jni.h was not found. Install a JDK (scripts/bootstrap build, or Debian's "
                        "openjdk-17-jdk-headless), or set JAVA_HOME or TAVIR_JNI_INCLUDE.")
  endif()
  # What differs between operating systems stands in a folder of its own.
  target_include_directories(tavir_jni_headers SYSTEM INTERFACE
                             ${TAVIR_JNI_INCLUDE} ${TAVIR_JNI_INCLUDE}/linux)
endif()
