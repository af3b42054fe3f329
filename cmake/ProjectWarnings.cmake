# Warnings as errors for the project's own targets (not for third-party code built alongside).
function(tarnstats_warnings target)
  target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Wshadow -Werror)
endfunction()
