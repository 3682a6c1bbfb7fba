# Shared helpers for the project's targets.

# Warnings as errors for our own code.
function(sg_warnings target)
    target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Werror)
endfunction()

# flock(1) makes a test's resource lock hold across build folders (see sg_add_gtest).
find_program(SG_FLOCK flock)

# sg_add_gtest(NAME name LABELS l1 [l2] SOURCES ... LIBS ... [ENV ...] [RESOURCE_LOCK lock] [TIMEOUT s])
# Builds one GoogleTest executable and registers it as one CTest test with its labels.
# Widget tests run headless through the offscreen platform.
function(sg_add_gtest)
    cmake_parse_arguments(T "" "NAME;TIMEOUT;RESOURCE_LOCK" "LABELS;SOURCES;LIBS;ENV" ${ARGN})
    add_executable(${T_NAME} ${T_SOURCES})
    if(SG_ONLY_SHM_WIN32)
        # The Qt-free cross build has no host stand-in: plain GoogleTest main.
        target_link_libraries(${T_NAME} PRIVATE ${T_LIBS} GTest::gtest GTest::gtest_main)
    else()
        # sgtestmain (tests/support) provides main(): QApplication, sgApp in a temporary
        # folder and the stray-modal fail-safe. A test that defines its own main keeps it.
        target_link_libraries(${T_NAME} PRIVATE ${T_LIBS} sgtestmain GTest::gtest)
    endif()
    sg_warnings(${T_NAME})
    # A resource lock also holds across build folders: the segment keys of the modeler are
    # machine-wide, so two checkouts testing at once would meet in them.
    if(T_RESOURCE_LOCK AND SG_FLOCK)
        add_test(NAME ${T_NAME} COMMAND ${SG_FLOCK} --close /tmp/sg-test-${T_RESOURCE_LOCK}.lock
            $<TARGET_FILE:${T_NAME}>)
    else()
        add_test(NAME ${T_NAME} COMMAND ${T_NAME})
    endif()
    if(NOT T_TIMEOUT)
        set(T_TIMEOUT 300)
    endif()
    set_tests_properties(${T_NAME} PROPERTIES LABELS "${T_LABELS}" TIMEOUT ${T_TIMEOUT}
        ENVIRONMENT "QT_QPA_PLATFORM=offscreen;SG_TEST_ARTIFACTS=${CMAKE_BINARY_DIR}/artifacts;${T_ENV}")
    if(T_RESOURCE_LOCK)
        set_tests_properties(${T_NAME} PROPERTIES RESOURCE_LOCK ${T_RESOURCE_LOCK})
    endif()
endfunction()

# sg_add_fuzzer(NAME name SOURCES ... LIBS ... CORPUS dir)
# A libFuzzer target (clang only, SG_BUILD_FUZZ=ON), built with AddressSanitizer and
# UndefinedBehaviorSanitizer. scripts/run-fuzz.sh replays its corpus and fuzzes it for a bounded time.
function(sg_add_fuzzer)
    cmake_parse_arguments(F "" "NAME;CORPUS" "SOURCES;LIBS" ${ARGN})
    add_executable(${F_NAME} ${F_SOURCES})
    target_link_libraries(${F_NAME} PRIVATE ${F_LIBS})
    target_compile_options(${F_NAME} PRIVATE -fsanitize=fuzzer)
    target_link_options(${F_NAME} PRIVATE -fsanitize=fuzzer)
    sg_warnings(${F_NAME})
    set_property(GLOBAL APPEND PROPERTY SG_FUZZERS "${F_NAME}|${F_CORPUS}")
endfunction()
