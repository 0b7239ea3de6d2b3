// What AddressSanitizer does where ASAN_OPTIONS says nothing else. A case is small and quick: freed
// memory of its own waits long enough in 16 MB, and fresh pages would cost more than the case.

extern "C" __attribute__((visibility("default"))) const char* __asan_default_options() {
    return "quarantine_size_mb=16:max_malloc_fill_size=0:malloc_context_size=8";
}
