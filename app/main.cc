#include "app/lapdmon.h"
#include "app/standard_streams.h"

int main(int argc, char** argv) {
    app::openStandardStreams();
    app::outliveOutput();
    app::decoupleStandardStreams();
    return app::runTrace(argc, argv);
}
