// Prints the life of a memory buffer, from the table that buffers run by, in the language of
// Graphviz: ./dev docs makes docs/pictures/bufferLife.svg of it.
#include <iostream>
#include <orv/mbStateMachine.h>

int main() {
    Orv::MbStateMachine::writeDot(std::cout);
    return std::cout.flush() ? 0 : 1;
}
