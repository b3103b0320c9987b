tessella_test(NAME error_test LABEL unit SOURCES error_test.cpp)
