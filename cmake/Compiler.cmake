# How everything of the project is compiled: warnings are errors, in every build.
add_compile_options(-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wsign-conversion
                    -Wnon-virtual-dtor -Woverloaded-virtual -Wold-style-cast -Werror)
# An aggregate's left-out members have the defaults that its declaration gives.
add_compile_options(-Wno-missing-field-initializers)
# What GCC 12's library uses of its own, though it is deprecated, clang lays at the door of whoever
# calls the library.
add_compile_options($<$<CXX_COMPILER_ID:Clang>:-Wno-deprecated-declarations>)
add_link_options(-Wl,--as-needed)
include_directories(${PROJECT_SOURCE_DIR})

if(NIMBRA_SANITIZERS)
  add_compile_options(-fsanitize=${NIMBRA_SANITIZERS} -fno-omit-frame-pointer
                      -fno-sanitize-recover=all)
  # The library's own checks of indices and of empty optionals, where nobody looks at speed.
  add_compile_definitions(_GLIBCXX_ASSERTIONS NIMBRA_SANITIZED)
  add_link_options(-fsanitize=${NIMBRA_SANITIZERS})
  # GCC 12's sanitizers make the optimiser see doubtful accesses in the standard library.
  add_compile_options($<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
endif()

# A bundle names all that it needs, but for the sanitizers' runtime, which is the program's.
if(NOT NIMBRA_SANITIZERS)
  set(NIMBRA_BUNDLE_OPTIONS -Wl,--no-undefined)
endif()

# Where sources are compiled together, one may shadow what another calls by a name; by itself, as it
# is installed, none does.
set(NIMBRA_UNITY_OPTIONS -Wno-shadow $<$<CXX_COMPILER_ID:GNU>:-Wno-subobject-linkage>)
if(CMAKE_UNITY_BUILD)
  add_compile_options(${NIMBRA_UNITY_OPTIONS})
endif()
