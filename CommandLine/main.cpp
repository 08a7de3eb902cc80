#include "CommandLine.h"

int main(int argc, char** argv) {
    return static_cast<int>(Commands::CommandLine().run(argc, argv));
}
