# Sanitizers and coverage reach every target, the test framework included. Checks of an object's type
# are left out: what derives from the device's framework classes has no type information.
if(VIDSHOW_SANITIZE)
    add_compile_options(-fsanitize=${VIDSHOW_SANITIZE} -fno-omit-frame-pointer
        -fno-sanitize-recover=all -fno-sanitize=vptr)
    add_link_options(-fsanitize=${VIDSHOW_SANITIZE})
endif()
if(VIDSHOW_COVERAGE)
    add_compile_options(--coverage -fprofile-abs-path)
    add_link_options(--coverage)
endif()
