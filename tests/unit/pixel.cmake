tessella_test(NAME pixel_test LABEL unit SOURCES
    colors_test.cpp
    context_test.cpp
    context_state_test.cpp
    image_test.cpp
    shapes_test.cpp)
