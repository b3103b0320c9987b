tessella_test(NAME xml_test LABEL unit SOURCES xml_test.cpp)
