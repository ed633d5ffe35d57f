#include "app/standard_streams.h"

#include <fcntl.h>
#include <pthread.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <cstdlib>
#include <iostream>
#include <map>
#include <memory>
#include <mutex>
#include <new>
#include <streambuf>
#include <string>
#include <system_error>
#include <thread>

#include "app/StreamWriter.h"

namespace app {

namespace {

constexpr std::chrono::seconds patience{1};

// The buffer of a C++ stream, which hands the text to the StreamWriter. Each thread has a text of its own.
class TextBuffer : public std::streambuf {
  public:
    TextBuffer(StreamWriter& writer, std::size_t stream) : writer_(writer), stream_(stream) {}

    // Held around a fork.
    std::mutex lock;

  protected:
    int_type overflow(int_type character) override {
        const char one = traits_type::to_char_type(character);
        if (!traits_type::eq_int_type(character, traits_type::eof()))
            xsputn(&one, 1);
        return traits_type::not_eof(character);
    }

    std::streamsize xsputn(const char* text, std::streamsize size) override {
        const std::string_view added(text, static_cast<std::size_t>(size));
        const std::lock_guard held(lock);
        try {
            begun_[std::this_thread::get_id()] += added;
        } catch (const std::bad_alloc&) {
            handOver();
            writer_.write(stream_, added);
        }
        if (added.ends_with('\n'))
            handOver();
        return size;
    }

    int sync() override {
        const std::lock_guard held(lock);
        handOver();
        return 0;
    }

  private:
    void handOver() {
        const auto own = begun_.find(std::this_thread::get_id());
        if (own == begun_.end())
            return;
        writer_.write(stream_, own->second);
        begun_.erase(own);
    }

    StreamWriter& writer_;
    std::size_t stream_;
    std::map<std::thread::id, std::string> begun_;
};

struct StandardStreams {
    StreamWriter writer{{STDOUT_FILENO, STDERR_FILENO}};
    TextBuffer out{writer, 0};
    TextBuffer err{writer, 1};
};

// Never deleted: the streams are used until the process ends.
StandardStreams* streams = nullptr;

void beforeFork() {
    streams->out.lock.lock();
    streams->err.lock.lock();
    streams->writer.beforeFork();
}

void unlockBuffers() {
    streams->err.lock.unlock();
    streams->out.lock.unlock();
}

void afterForkInParent() {
    streams->writer.afterForkInParent();
    unlockBuffers();
}

void afterForkInChild() {
    streams->writer.afterForkInChild(patience);
    unlockBuffers();
}

void beforeAbort(int) { awaitStandardStreams(); }

}  // namespace

void openStandardStreams() {
    for (const int each : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(each, F_GETFD) < 0)
            static_cast<void>(open("/dev/null", O_RDWR));  // open() takes the lowest free number: `each`
    }
}

void outliveOutput() {
    static_cast<void>(std::signal(SIGPIPE, SIG_IGN));
    static_cast<void>(std::signal(SIGXFSZ, SIG_IGN));
}

void decoupleStandardStreams() try {
    streams = std::make_unique<StandardStreams>().release();
    std::cout.rdbuf(&streams->out);
    std::cerr.rdbuf(&streams->err);
    std::cerr << std::nounitbuf;  // so that a line that is written in several pieces is one text
    static_cast<void>(std::atexit(endStandardStreams));
    static_cast<void>(std::signal(SIGABRT, beforeAbort));
    pthread_atfork(beforeFork, afterForkInParent, afterForkInChild);
} catch (const std::system_error&) {  // the system has refused the thread
}

void awaitStandardStreams() {
    if (streams != nullptr)
        streams->writer.awaitWritten(patience);
}

void endStandardStreams() {
    if (streams == nullptr)
        return;
    std::cout << std::flush;
    std::cerr << std::flush;
    streams->writer.end(patience);
}

}  // namespace app
