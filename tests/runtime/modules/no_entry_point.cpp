// tests/runtime/modules/no_entry_point.cpp: a shared object that is no module.
extern "C" int notTheEntryPoint();

int notTheEntryPoint() {
    return 1;
}
