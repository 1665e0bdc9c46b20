# The project's warnings on one target; errors with TAVIR_WERROR.
function(tavir_warnings target)
  target_compile_options(${target} PRIVATE
    -Wall -Wextra -Wshadow -Wpedantic -Wno-psabi
    $<$<COMPILE_LANGUAGE:CXX>:-Wconversion -Wsign-conversion -Wnon-virtual-dtor -Wold-style-cast>
    $<$<BOOL:${TAVIR_WERROR}>:-Werror>)
endfunction()
