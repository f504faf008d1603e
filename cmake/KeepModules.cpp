// What a driver allocates and keeps until the process ends is let pass by the name of its module
// (tests/support/driver-leaks.txt), and a module that has been unloaded has no name any more. So in the
// sanitizers' builds nothing is unloaded.
extern "C" __attribute__((visibility("default"))) int dlclose(void*);
int dlclose(void*) { return 0; }
