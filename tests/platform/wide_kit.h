#pragma once

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>

/// The library's function of a name that the C library has too. Looked up in the library itself:
/// a sanitizer puts its own in front of some of them.
#define OURS(name) reinterpret_cast<decltype(&::name)>(wide_kit::Find(#name))

namespace wide_kit {

inline void* Find(const char* name) {
    static void* const library = dlopen("libvidshowhw2-19.so", RTLD_LAZY | RTLD_NOLOAD);
    void* found = library != nullptr ? dlsym(library, name) : nullptr;
    if (found == nullptr) {
        std::fprintf(stderr, "the library has no %s\n", name);
        std::abort();
    }
    return found;
}

/// A byte string as the layer's functions take it. Never inline: the compiler would see a wide
/// string that lacks its end.
__attribute__((noinline)) inline const wchar_t* Wide(const char* text) {
    return static_cast<const wchar_t*>(static_cast<const void*>(text));
}

__attribute__((noinline)) inline wchar_t* Wide(char* text) {
    return static_cast<wchar_t*>(static_cast<void*>(text));
}

}  // namespace wide_kit
