# Warnings for our own targets only: vt_warnings(target).
function(vt_warnings target)
  target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Wshadow)
  if(VT_WERROR)
    target_compile_options(${target} PRIVATE -Werror)
  endif()
endfunction()
