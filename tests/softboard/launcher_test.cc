// The launcher as it is run: what it prints, its exit status, and the program on its board.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <sstream>

#include "softboard/command_line.h"

namespace softboard {
namespace {

const std::string examples = LAPDMON_SOURCE_DIR "/examples/";

struct Ran {
    int status = -1;
    std::string out;
    std::string err;
};

std::string readFile(const std::filesystem::path& path) {
    std::ostringstream text;
    text << std::ifstream(path).rdbuf();
    return text.str();
}

class LauncherTest : public testing::Test {
  protected:
    LauncherTest() : folder_(makeFolder()) {}
    ~LauncherTest() override { std::filesystem::remove_all(folder_); }

    Ran run(std::vector<std::string> arguments) { return runAs(SOFTBOARD_LAUNCHER, std::move(arguments)); }

    Ran runAs(const std::string& launcher, std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), launcher);
        std::vector<char*> argv;
        argv.reserve(arguments.size() + 1);
        for (std::string& argument : arguments) {
            argv.push_back(argument.data());
        }
        argv.push_back(nullptr);
        posix_spawn_file_actions_t files;
        posix_spawn_file_actions_init(&files);
        posix_spawn_file_actions_addopen(&files, 1, path("out").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        posix_spawn_file_actions_addopen(&files, 2, path("err").c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        pid_t child = -1;
        Ran ran;
        EXPECT_EQ(posix_spawn(&child, launcher.c_str(), &files, nullptr, argv.data(), environ), 0);
        posix_spawn_file_actions_destroy(&files);
        int status = 0;
        waitpid(child, &status, 0);
        ran.status = WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
        ran.out = readFile(path("out"));
        ran.err = readFile(path("err"));
        return ran;
    }

    std::string path(const std::string& name) const { return folder_ / name; }

  private:
    static std::filesystem::path makeFolder() {
        std::string name = testing::TempDir() + "softboard-launcher-XXXXXX";
        return mkdtemp(name.data());
    }

    std::filesystem::path folder_;
};

TEST_F(LauncherTest, HelpShowsEveryOptionAndExamples) {
    const Ran ran = run({"--help"});
    EXPECT_EQ(ran.status, 0);
    EXPECT_EQ(ran.err, "");
    for (const char* expected :
         {"softboard [options] -- PROGRAM ARGS...", "--frames", "--protocol",
          "4ess|5ess|dms100|ntt|net5|ni2|N", "--rate", "recorded|FPS|max", "--loop", "--no-loop", "--board",
          "--dchannels", "--scenario", "--journal", "--fault NAME[=N]", "reply-other-source=N", "--version",
          "softboard -- lapdmon -b1"}) {
        EXPECT_NE(ran.out.find(expected), std::string::npos) << expected;
    }
}

TEST_F(LauncherTest, TheVersionIsTold) {
    const Ran ran = run({"--version"});
    EXPECT_EQ(ran.status, 0);
    EXPECT_EQ(ran.out, "softboard " LAPDMON_VERSION "\n");
}

TEST_F(LauncherTest, AMistakeIsReportedAndTheProgramIsNotStarted) {
    const std::string toml = path("bad.toml");
    std::ofstream(toml) << "board = 1\nrate = \"fast\"\n";
    struct {
        std::vector<std::string> arguments;
        std::string message;
    } const cases[] = {
        {{}, "no program to run: softboard [options] -- PROGRAM ARGS... (--help tells more)"},
        {{"--"}, "no program to run: softboard [options] -- PROGRAM ARGS... (--help tells more)"},
        {{"--bogus", "--"}, "The following argument was not expected: --bogus"},
        {{"ls", "--"}, "The following argument was not expected: ls"},
        {{"--frames", "--"}, "--frames: 1 required FILE missing"},
        {{"--rate", "fast", "--"},
         "--rate: \"fast\" is neither recorded, max nor a number of frames per second"},
        {{"--protocol", "isdn", "--"},
         "--protocol: \"isdn\" is none of 4ess, 5ess, dms100, ntt, net5, ni2 and no number"},
        {{"--board", "256", "--"}, "--board: \"256\" is no number from 0 to 255"},
        {{"--dchannels", "0", "--"}, "--dchannels: \"0\" is no number from 1 to 255"},
        {{"--frames", "/gone.pcap", "--"}, "/gone.pcap: No such file or directory"},
        {{"--frames", toml, "--"}, toml + ": unknown file format"},
        {{"--scenario", toml, "--"},
         toml + ":2: rate: \"fast\" is neither recorded, max nor a number of frames per second"},
        {{"--fault", "none", "--"}, "--fault: there is no fault \"none\" (softboard --help lists them)"},
        {{"--journal", "/gone/journal", "--"}, "/gone/journal: No such file or directory"},
    };
    const std::string mark = path("mark");
    for (const auto& c : cases) {
        std::vector<std::string> arguments = c.arguments;
        if (arguments.size() > 1) {
            arguments.insert(arguments.end(), {"touch", mark});
        }
        const Ran ran = run(arguments);
        EXPECT_EQ(ran.status, 2) << c.message;
        EXPECT_EQ(ran.err, "softboard: " + c.message + "\n");
        EXPECT_EQ(ran.out, "");
        EXPECT_FALSE(std::filesystem::exists(mark)) << c.message;
    }
}

TEST_F(LauncherTest, AMissingProgramGivesTheStatusThatAShellGives) {
    Ran ran = run({"--", "no-such-program"});
    EXPECT_EQ(ran.status, 127);
    EXPECT_EQ(ran.err, "softboard: no-such-program: No such file or directory\n");
    ran = run({"--", "/"});
    EXPECT_EQ(ran.status, 126);
    EXPECT_EQ(ran.err, "softboard: /: Permission denied\n");
}

TEST_F(LauncherTest, TheLauncherPassesArgumentsOnAndReturnsTheProgramsStatus) {
    EXPECT_EQ(run({"--", "true"}).status, 0);
    EXPECT_EQ(run({"--", "false"}).status, 1);
    const Ran ran = run({"--", "echo", "--help", "--", "-b1"});
    EXPECT_EQ(ran.out, "--help -- -b1\n");
}

TEST_F(LauncherTest, WithoutOptionsTheBuiltinCapturePlays) {
    const Ran ran = run({"--", SOFTBOARD_PROBE, "-b1"});
    EXPECT_EQ(ran.status, 7);
    EXPECT_EQ(ran.err, "");
    EXPECT_EQ(ran.out,
              "argument -b1\n"
              "protocol 7\n"
              "event 0200000001000000000000000300000000017f\n"
              "event 02000000000000000200000003000000000173\n");
}

TEST_F(LauncherTest, CaptureProtocolAndRateReachTheBoard) {
    const Ran ran = run(
        {"--frames", examples + "5ess.pcap", "--protocol", "5ess", "--rate", "max", "--", SOFTBOARD_PROBE});
    EXPECT_EQ(ran.out,
              "protocol 2\n"
              "event 0200000001000000000000000300000000017f\n"
              "event 0200000000000000020000000300000000011f\n");
}

TEST_F(LauncherTest, AScenarioFileReachesTheBoard) {
    const Ran ran =
        run({"--scenario", examples + "two-dchannels.toml", "--protocol", "1", "--", SOFTBOARD_PROBE});
    EXPECT_EQ(ran.out.substr(0, 11), "protocol 7\n");
}

TEST_F(LauncherTest, TheJournalHoldsEveryMessageAndTheBalance) {
    std::ofstream(path("journal")) << "of an earlier run\n";
    EXPECT_EQ(run({"--rate", "max", "--journal", path("journal"), "--", SOFTBOARD_PROBE}).status, 7);
    const std::string journal = readFile(path("journal"));
    const std::string start =
        "host->board 18 GetParm {Num 7} from 1/0/0/0/1 to 0/1/1/21/1 trans 10000\n"
        "board->host 19 GetParmCmplt {Num 7 Val 7 TextSize 0} from 0/1/1/21/1 to 1/0/0/0/1 trans 10000\n"
        "host->board 22 DetectEvt {RetAddr 1/0/0/0/1 EvtType 2 EvtGroup 0} from 1/0/0/0/1 to 0/1/1/21/1 "
        "trans 10000\n"
        "board->host 23 DetectEvtCmplt {} from 0/1/1/21/1 to 1/0/0/0/1 trans 10000\n"
        "host->board 8 SetParm {Parm 10 Val 1} from 1/0/0/0/1 to 0/1/1/21/1 trans 10000\n"
        "board->host 9 SetParmCmplt {} from 0/1/1/21/1 to 1/0/0/0/1 trans 10000\n"
        "board->host 32 EvtDetected {EvtGroup 2 Direction 1 Timestamp 0 Length 3 List 00017f}"
        " from 0/1/1/21/1 to 1/0/0/0/1 trans 0\n";
    const std::string end = "\nbuffers outstanding 0, queues open 0\n";
    EXPECT_EQ(journal.substr(0, start.size()), start);
    ASSERT_GE(journal.size(), end.size());
    EXPECT_EQ(journal.substr(journal.size() - end.size()), end);
}

TEST_F(LauncherTest, AProgramBesideTheLauncherIsFoundFirst) {
    namespace fs = std::filesystem;
    fs::create_directories(path("bin"));
    fs::create_directories(path("lib/lapdmon"));
    fs::copy(SOFTBOARD_LAUNCHER, path("bin/softboard"));
    std::ofstream(path("lib/lapdmon/libnorv.so")) << "";
    std::ofstream(path("bin/true")) << "#!/bin/sh\necho beside; echo $LD_LIBRARY_PATH\n";
    fs::permissions(path("bin/true"), fs::perms::owner_all);
    setenv("LD_LIBRARY_PATH", "/somewhere", 1);
    const Ran ran = runAs(path("bin/softboard"), {"--", "true"});
    unsetenv("LD_LIBRARY_PATH");
    EXPECT_EQ(ran.out, "beside\n" + path("lib/lapdmon") + ":/somewhere\n");
}

TEST_F(LauncherTest, WithoutTheLibraryNothingIsStarted) {
    std::filesystem::create_directories(path("bin"));
    std::filesystem::copy(SOFTBOARD_LAUNCHER, path("bin/softboard"));
    const Ran ran = runAs(path("bin/softboard"), {"--", "true"});
    EXPECT_EQ(ran.status, 2);
    EXPECT_EQ(ran.err, "softboard: " + path("lib/lapdmon/libnorv.so") + ": No such file or directory\n");
}

TEST_F(LauncherTest, AProgramRunWithoutTheLauncherHasTheBuiltinCaptureToo) {
    EXPECT_EQ(runAs(SOFTBOARD_PROBE, {}).out.substr(0, 11), "protocol 7\n");
}

TEST_F(LauncherTest, AScenarioThatCannotBeReadIsSaid) {
    setenv("SOFTBOARD_SCENARIO", "/nowhere", 1);
    const Ran ran = runAs(SOFTBOARD_PROBE, {});
    unsetenv("SOFTBOARD_SCENARIO");
    EXPECT_EQ(ran.status, -SIGABRT);
    EXPECT_EQ(ran.err, "softboard: SOFTBOARD_SCENARIO=/nowhere: No such file or directory\n");
}

}  // namespace
}  // namespace softboard
