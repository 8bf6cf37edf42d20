#include <unistd.h>

/// Does nothing, with everything linked that the daemon links.
int main() { return ::pause(); }
