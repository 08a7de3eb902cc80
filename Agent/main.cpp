// The per-user background program: all that it does is in the library.

#include "Agent/OVAgentFrameworkMain.h"

int main() {
    return OVAgentFrameworkMain();
}
