#include "app/unhandled.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <new>
#include <sstream>
#include <stdexcept>
#include <thread>

#include "app/Log.h"
#include "app/guarded.h"
#include "app/standard_streams.h"
#include "vela/Exception.h"

namespace app {
namespace {

[[noreturn]] void endByAnException(const std::string& name) {
    decoupleStandardStreams();
    closeLogWhenUnhandled();
    traceLog.open(name.c_str());
    traceLog.write("one entry\n");
    std::thread([] { guarded(215, [] { throw std::runtime_error("out of luck"); }); }).join();
    std::abort();
}

TEST(UnhandledDeathTest, ClosesTheLogAndNamesTheExceptionAndItsPlace) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const std::string name = testing::TempDir() + "unhandled.log";
    EXPECT_EXIT(endByAnException(name), testing::ExitedWithCode(1),
                "lapdmon: the trace ends, nobody handled std::runtime_error: out of luck in lapdmon.215.");
    std::ostringstream log;
    log << std::ifstream(name).rdbuf();
    EXPECT_EQ(log.str(), "one entry\n");
}

struct Unspeakable : vela::Exception {
    Unspeakable() : Exception("") {}
    void toStream(std::ostream*) const override { throw std::bad_alloc(); }
};

[[noreturn]] void endByAnExceptionThatCannotBeNamed(const std::string& name) {
    decoupleStandardStreams();
    closeLogWhenUnhandled();
    traceLog.open(name.c_str());
    traceLog.write("one entry\n");
    std::thread([] { throw Unspeakable(); }).join();
    std::abort();
}

TEST(UnhandledDeathTest, EndsInOrderEvenWithoutMemoryForTheReport) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const std::string name = testing::TempDir() + "unspeakable.log";
    EXPECT_EXIT(endByAnExceptionThatCannotBeNamed(name), testing::ExitedWithCode(1),
                "lapdmon: the trace ends, nobody handled an exception\n");
    std::ostringstream log;
    log << std::ifstream(name).rdbuf();
    EXPECT_EQ(log.str(), "one entry\n");
}

}  // namespace
}  // namespace app
