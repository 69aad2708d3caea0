# Instrumented builds, each in a build directory of its own.
#
# TAMSEL_SANITIZE: AddressSanitizer and UndefinedBehaviorSanitizer on every
# target, at -O1 with line tables only, so that the build and the tests stay
# quick; the first report ends the process.
# scripts/run-sanitizer-tests.sh gives the tests the runtime options; the
# fuzzers' tests get them through TAMSEL_TEST_ENVIRONMENT.
#
# TAMSEL_FUZZ: clang's libFuzzer on top of the same two sanitizers; the code
# under test is built with coverage, the harnesses in fuzz/ link libFuzzer.

set(TAMSEL_TEST_ENVIRONMENT "")

if(TAMSEL_SANITIZE OR TAMSEL_FUZZ)
  set(_sanitizers address,undefined)
  add_compile_options(-fsanitize=${_sanitizers} -fno-omit-frame-pointer
                      -fno-sanitize-recover=undefined)
  add_link_options(-fsanitize=${_sanitizers})
  foreach(_lang C CXX)
    set(CMAKE_${_lang}_FLAGS_RELWITHDEBINFO "-O1 -g1" CACHE STRING "" FORCE)
  endforeach()
  if(TAMSEL_SANITIZE)
    # Qt's xcb platform plug-in brings Qt's D-Bus module and unloads both when
    # the process ends, before LeakSanitizer looks: the leaks they keep (see
    # tests/sanitizers/lsan.supp) would then show no library to suppress them
    # by. Loaded with every program, the module stays.
    find_package(Qt6 REQUIRED COMPONENTS DBus)
    add_link_options(LINKER:--no-as-needed)
    link_libraries(Qt6::DBus)
  endif()
  if(TAMSEL_SANITIZE AND NOT DEFINED CMAKE_UNITY_BUILD)
    # Built once per CI run from nothing: the product's sources compiled in
    # batches parse Qt's headers once per batch, which saves a good part of
    # the build. (GCC then sees a source's own anonymous types as a header's,
    # hence the warning off.) The tests, whose files often share helper
    # names, are compiled one by one (tests/CMakeLists.txt).
    set(CMAKE_UNITY_BUILD ON)
    set(CMAKE_UNITY_BUILD_BATCH_SIZE 16)
    add_compile_options(-Wno-subobject-linkage)
  endif()
  # The benchmarks measure the product, not its instrumented twin.
  set(TAMSEL_BUILD_BENCH OFF CACHE BOOL "" FORCE)
  set(_suppressions ${PROJECT_SOURCE_DIR}/tests/sanitizers)
  set(TAMSEL_TEST_ENVIRONMENT
    "ASAN_OPTIONS=detect_leaks=1:detect_stack_use_after_return=0:strict_init_order=1:check_initialization_order=1"
    "LSAN_OPTIONS=suppressions=${_suppressions}/lsan.supp:print_suppressions=0"
    "UBSAN_OPTIONS=print_stacktrace=1:halt_on_error=1:suppressions=${_suppressions}/ubsan.supp")
endif()

if(TAMSEL_FUZZ)
  if(NOT CMAKE_CXX_COMPILER_ID STREQUAL "Clang")
    message(FATAL_ERROR "TAMSEL_FUZZ needs clang: configure with -DCMAKE_CXX_COMPILER=clang++-14 "
                        "-DCMAKE_C_COMPILER=clang-14")
  endif()
  add_compile_options(-fsanitize=fuzzer-no-link)
  set(TAMSEL_BUILD_TESTS OFF CACHE BOOL "" FORCE)
endif()
