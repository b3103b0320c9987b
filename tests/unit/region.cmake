tessella_test(NAME region_test LABEL unit SOURCES
    region_random_test.cpp
    region_rules_test.cpp
    region_test.cpp
    ../support/region_judge.cpp
    ../support/region_text.cpp)
