// A module that calls a function nobody has.

extern "C" int FunctionThatNobodyHas();

extern "C" __attribute__((visibility("default"))) int CallIt() {
    return FunctionThatNobodyHas();
}
