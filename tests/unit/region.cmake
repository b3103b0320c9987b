tessella_test(NAME region_test LABEL unit SOURCES

    region_random_test.cpp
    ../support/region_judge.cpp
    ../support/region_text.cpp)
