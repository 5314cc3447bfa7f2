// Compiled against one layer's library alone: PROBE_HEADER either is visible to that layer or the
// compile fails with the header not found.
#include PROBE_HEADER

int main() { return 0; }
