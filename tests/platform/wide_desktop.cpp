// usage: wide_desktop LIBRARY
// A program of the desktop, linked with the C and the C++ library, loads ours so that all of the
// process sees its names, and goes on. Its calls are bound at their first use, which is after that.

#include <dlfcn.h>

#include <cstdio>

#include "platform/wide_caller.h"

extern "C" void AskWide(WideAnswers* answers);

static int Fail(const char* why) {
    std::fprintf(stderr, "%s\n", why);
    return 1;
}

int main(int argc, char** argv) {
    if (argc != 2) return Fail("usage: wide_desktop LIBRARY");
    void* ours = dlopen(argv[1], RTLD_NOW | RTLD_GLOBAL);
    if (ours == nullptr) return Fail(dlerror());
    WideAnswers answers = {};
    AskWide(&answers);
    if (!(answers == kOfTheCLibrary)) return Fail("the program's calls are not the C library's");

    void* inOurs = dlsym(ours, "wcwidth");
    void* inProcess = dlsym(RTLD_DEFAULT, "wcwidth");
    if (inOurs == nullptr || inOurs == inProcess) return Fail("our own name is not found in ours");
    if (reinterpret_cast<int (*)(wchar_t)>(inOurs)(7) != 1) return Fail("it is not ours");
    if (reinterpret_cast<int (*)(wchar_t)>(inProcess)(7) != -1) return Fail("the process lost its");
    return 0;
}
