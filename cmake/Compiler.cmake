# How everything of the project is compiled: warnings are errors, in every build.
add_compile_options(-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wsign-conversion
                    -Wnon-virtual-dtor -Woverloaded-virtual -Wold-style-cast -Werror)
# An aggregate's left-out members have the defaults that its declaration gives.
add_compile_options(-Wno-missing-field-initializers)
add_link_options(-Wl,--as-needed)
include_directories(${PROJECT_SOURCE_DIR})

if(NIMBRA_SANITIZERS)
  add_compile_options(-fsanitize=${NIMBRA_SANITIZERS} -fno-omit-frame-pointer
                      -fno-sanitize-recover=all)
  # The library's own checks of indices and of empty optionals, where nobody looks at speed.
  add_compile_definitions(_GLIBCXX_ASSERTIONS)
  add_link_options(-fsanitize=${NIMBRA_SANITIZERS})
  # GCC 12's sanitizers make the optimiser see doubtful accesses in the standard library.
  add_compile_options($<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
endif()

if(CMAKE_UNITY_BUILD)
  # What one source calls by a name, another one may shadow; by itself, as it is installed, none does.
  add_compile_options(-Wno-shadow -Wno-subobject-linkage)
endif()
