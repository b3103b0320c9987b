tessella_test(NAME pixel_test LABEL unit SOURCES
    blend_test.cpp
    colors_test.cpp
    context_test.cpp
    context_state_test.cpp
    image_test.cpp
    shapes_test.cpp
    LIBRARIES tessella_console_interpose)
