#include "bench/road/run.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <system_error>

#include "bench/road/stamps.h"

namespace bench {

namespace {

namespace fs = std::filesystem;

int checked(int result, const char* what) {
    if (result < 0)
        throw std::system_error(errno, std::generic_category(), what);
    return result;
}

class Descriptor {
  public:
    Descriptor(int descriptor, const char* what) : descriptor_(checked(descriptor, what)) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    ~Descriptor() { close(descriptor_); }

    int get() const { return descriptor_; }

  private:
    int descriptor_;
};

// A temporary folder with the log, which is a FIFO. A line counts as in the log when it can be read from the
// FIFO.
class LogPipe {
  public:
    LogPipe() : folder_(makeFolder()), path_(folder_ / "log"), reader_(make(), "log") {
        constexpr int octets = 1 << 20;
        fcntl(reader_.get(), F_SETPIPE_SZ, octets);
    }
    LogPipe(const LogPipe&) = delete;
    LogPipe& operator=(const LogPipe&) = delete;
    ~LogPipe() {
        std::error_code ignored;
        fs::remove_all(folder_, ignored);
    }

    const std::string& path() const { return path_; }
    int reader() const { return reader_.get(); }

  private:
    static fs::path makeFolder() {
        std::string pattern = fs::temp_directory_path() / "bench-road-XXXXXX";
        checked(mkdtemp(pattern.data()) == nullptr ? -1 : 0, "mkdtemp");
        return pattern;
    }
    int make() const {
        checked(mkfifo(path_.c_str(), 0600), "mkfifo");
        return open(path_.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    }

    fs::path folder_;
    std::string path_;
    Descriptor reader_;
};

class SharedStamps {
  public:
    SharedStamps() : memory_(memfd_create("stamps", 0), "memfd_create") {
        checked(ftruncate(memory_.get(), sizeof(Stamps)), "ftruncate");
        void* const shared =
            mmap(nullptr, sizeof(Stamps), PROT_READ | PROT_WRITE, MAP_SHARED, memory_.get(), 0);
        checked(shared == MAP_FAILED ? -1 : 0, "mmap");
        stamps_ = static_cast<Stamps*>(shared);
    }
    SharedStamps(const SharedStamps&) = delete;
    SharedStamps& operator=(const SharedStamps&) = delete;
    ~SharedStamps() { munmap(stamps_, sizeof(Stamps)); }

    int descriptor() const { return memory_.get(); }
    Stamps& get() const { return *stamps_; }

  private:
    Descriptor memory_;
    Stamps* stamps_ = nullptr;
};

std::string thisProgram() { return fs::read_symlink("/proc/self/exe"); }
std::string softwareBoard() { return fs::path(thisProgram()).parent_path() / "softboard"; }

// The process that is measured. Its standard input is a pipe, and its screen is /dev/null.
class Traced {
  public:
    Traced(const std::string& rate, int stamps, const std::string& log) {
        std::array<int, 2> ends{};
        checked(pipe2(ends.data(), O_CLOEXEC), "pipe2");
        const Descriptor input(ends[0], "pipe2");
        operator_ = ends[1];
        pid_ = checked(fork(), "fork");
        if (pid_ == 0)
            become(rate, std::to_string(stamps), log, input.get());
        checked(clock_getcpuclockid(pid_, &cpuClock_) == 0 ? 0 : -1, "clock_getcpuclockid");
    }
    Traced(const Traced&) = delete;
    Traced& operator=(const Traced&) = delete;
    ~Traced() {
        close(operator_);
        if (pid_ > 0) {
            kill(pid_, SIGKILL);
            waitpid(pid_, nullptr, 0);
        }
    }

    void typeQuit() const { checked(static_cast<int>(write(operator_, "q\n", 2)), "q"); }

    double cpuSeconds() const {
        std::timespec used{};
        clock_gettime(cpuClock_, &used);
        return static_cast<double>(used.tv_sec) + static_cast<double>(used.tv_nsec) / 1e9;
    }

    // A number from /proc/PID/status; 0 when it has no such line.
    long status(const std::string& name) const {
        std::ifstream file("/proc/" + std::to_string(pid_) + "/status");
        for (std::string word; file >> word;) {
            if (long value = 0; word == name + ":" && file >> value)
                return value;
        }
        return 0;
    }

    bool hasEnded() {
        int status = 0;
        if (pid_ > 0 && waitpid(pid_, &status, WNOHANG) == pid_)
            pid_ = -1;
        return pid_ < 0;
    }

    int wait() {
        int status = -1;
        if (pid_ > 0)
            waitpid(pid_, &status, 0);
        pid_ = -1;
        return status;
    }

  private:
    [[noreturn]] static void become(const std::string& rate, const std::string& stamps,
                                    const std::string& log, int input) {
        const std::string self = thisProgram();
        const std::string board = softwareBoard();
        dup2(input, STDIN_FILENO);
        dup2(open("/dev/null", O_WRONLY), STDOUT_FILENO);
        execl(board.c_str(), board.c_str(), "--loop", "--rate", rate.c_str(), "--", self.c_str(), "--traced",
              stamps.c_str(), log.c_str(), nullptr);
        _exit(127);
    }

    pid_t pid_ = -1;
    int operator_ = -1;
    clockid_t cpuClock_ = 0;
};

class Measurement {
  public:
    Measurement(const std::string& rate, std::uint64_t frames)
        : wanted_(frames), traced_(rate, stamps_.descriptor(), log_.path()) {
        run_.latencies.reserve(frames);
    }

    Run measure() {
        while (takePiece()) {
        }
        watch_.end();
        run_.status = traced_.wait();
        run_.checked = watch_.checked();
        return std::move(run_);
    }

  private:
    // Reads what has come of the log. Returns false when the log has been closed or the process has ended
    // without one.
    bool takePiece() {
        constexpr int patienceMs = 100;
        pollfd waited{log_.reader(), POLLIN, 0};
        if (poll(&waited, 1, patienceMs) <= 0)
            return !traced_.hasEnded();
        const ssize_t got = read(log_.reader(), piece_.data(), piece_.size());
        if (got <= 0)
            return got < 0 && (errno == EAGAIN || errno == EINTR);
        account(watch_.take({piece_.data(), static_cast<std::size_t>(got)}), nowNs());
        return true;
    }

    void account(std::uint64_t headers, std::int64_t now) {
        stamps_.get().seen += headers;
        for (; headers > 0 && logged_ < wanted_; --headers, ++logged_)
            run_.latencies.push_back(static_cast<double>(now - stamps_.get().of(logged_)) / 1e3);
        if (logged_ == 0 || finished_)
            return;
        if (start_ == 0)
            begin(now);
        if (now - lastLook_ > lookEveryNs || logged_ == wanted_)
            look(now);
        if (logged_ == wanted_)
            finish(now);
    }

    void begin(std::int64_t now) {
        start_ = now;
        startCpu_ = traced_.cpuSeconds();
        firstFrames_ = logged_;
    }

    void look(std::int64_t now) {
        lastLook_ = now;
        run_.mostThreads = std::max(run_.mostThreads, traced_.status("Threads"));
        run_.peakKilobytes = std::max(run_.peakKilobytes, traced_.status("VmHWM"));
    }

    void finish(std::int64_t now) {
        finished_ = true;
        run_.seconds = static_cast<double>(now - start_) / 1e9;
        run_.cpuSeconds = traced_.cpuSeconds() - startCpu_;
        run_.frames = logged_ - firstFrames_;
        traced_.typeQuit();
    }

    static constexpr std::int64_t lookEveryNs = 20000000;

    Run run_;
    std::uint64_t wanted_;
    Played played_{softboard::builtinFrames()};
    LogWatch watch_{played_};
    LogPipe log_;
    SharedStamps stamps_;
    Traced traced_;
    std::array<char, 65536> piece_{};
    std::uint64_t logged_ = 0;
    std::int64_t start_ = 0;
    std::int64_t lastLook_ = 0;
    double startCpu_ = 0;
    std::uint64_t firstFrames_ = 0;
    bool finished_ = false;
};

}  // namespace

Run runRoad(const std::string& rate, std::uint64_t frames) { return Measurement(rate, frames).measure(); }

double runReading(const std::string& rate, double seconds, bool threadForEach) {
    const std::string command = "exec '" + softwareBoard() + "' --loop --rate " + rate + " -- '" +
                                thisProgram() + "' --reading " + std::to_string(seconds) +
                                (threadForEach ? " 1" : " 0");
    double used = 0;
    FILE* const output = popen(command.c_str(), "r");
    if (output == nullptr)
        return 0;
    const bool read = std::fscanf(output, "%lf", &used) == 1;
    return pclose(output) == 0 && read ? used : 0;
}

}  // namespace bench
