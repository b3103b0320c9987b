# The twin of the resource service brings fonts of any kind.
tessella_test(NAME font_test LABEL unit SOURCES
    cgf_test.cpp
    font_test.cpp
    ../support/memory_bundle.cpp)
