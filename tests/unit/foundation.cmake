tessella_test(NAME error_test LABEL unit SOURCES error_test.cpp)
tessella_test(NAME file_test LABEL unit SOURCES file_test.cpp)
