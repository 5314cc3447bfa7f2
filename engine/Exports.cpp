// The plug-in's exported entry points. No exception ever crosses them.
#define VELMORA_EXPORT extern "C" __attribute__((visibility("default")))

VELMORA_EXPORT int MyFunc() { return -1; }
