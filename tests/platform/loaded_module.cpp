// A module for the tests to load, search, call and free.

#pragma GCC visibility push(default)
extern "C" {

int g_number = 1234;
bool* g_unloaded = nullptr;

int AddNumbers(int a, int b) {
    return a + b;
}

}  // extern "C"
#pragma GCC visibility pop

__attribute__((destructor)) static void TellThatItIsUnloaded() {
    if (g_unloaded != nullptr) *g_unloaded = true;
}
