#include "reader/program.h"

int main(int argc, char** argv) { return reader::runProgram({argv + 1, argv + argc}); }
