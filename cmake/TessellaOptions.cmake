# What every target of the project is compiled with.
option(TESSELLA_WERROR "Treat warnings as errors" OFF)
set(TESSELLA_SANITIZE "" CACHE STRING "Sanitizers for all targets, as -fsanitize takes them")
option(TESSELLA_FUZZ "Build the libFuzzer targets (clang only)" OFF)

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
find_package(Threads REQUIRED)

add_library(tessella_options INTERFACE)
target_include_directories(tessella_options INTERFACE ${PROJECT_SOURCE_DIR}/include ${PROJECT_SOURCE_DIR})
target_compile_options(tessella_options INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow $<$<BOOL:${TESSELLA_WERROR}>:-Werror>)
# Assertions report the file as this folder and the module's name.
target_compile_definitions(tessella_options INTERFACE TESSELLA_BUILD_FOLDER="${PROJECT_SOURCE_DIR}/")
target_link_libraries(tessella_options INTERFACE Threads::Threads)

if(TESSELLA_SANITIZE)
    add_compile_options(-fsanitize=${TESSELLA_SANITIZE} -fno-omit-frame-pointer)
    if(TESSELLA_SANITIZE MATCHES undefined)
        add_compile_options(-fno-sanitize-recover=undefined)
    endif()
    add_link_options(-fsanitize=${TESSELLA_SANITIZE})
endif()
if(TESSELLA_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link)
endif()
