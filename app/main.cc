#include "app/lapdmon.h"

int main(int argc, char** argv) { return app::runTrace(argc, argv); }
