# Warning and sanitizer flags shared by every target of the project.
function(orzavs_target_options target)
  if(CMAKE_CXX_COMPILER_ID MATCHES "GNU|Clang")
    target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor)
    if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
      # Proves the locking annotations of types/Mutex.h (fields ORZAVS_GUARDED_BY a mutex).
      target_compile_options(${target} PRIVATE -Wthread-safety)
    endif()
    if(ORZAVS_WERROR)
      target_compile_options(${target} PRIVATE -Werror)
    endif()
  endif()
endfunction()

if(ORZAVS_SANITIZE)
  add_compile_options(-fsanitize=${ORZAVS_SANITIZE} -fno-omit-frame-pointer -fno-sanitize-recover=all)
  add_link_options(-fsanitize=${ORZAVS_SANITIZE})
endif()
