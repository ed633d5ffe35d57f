#include "app/StreamWriter.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <climits>
#include <condition_variable>
#include <cstdint>
#include <ctime>
#include <deque>
#include <mutex>
#include <new>
#include <optional>
#include <string>
#include <thread>
#include <utility>

namespace app {

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr int forEver = -1;
// A pipe that is ready for writing takes this many octets without blocking.
constexpr std::size_t largestWrite = PIPE_BUF;

unsigned long linesIn(std::string_view text) {
    const auto ends = static_cast<unsigned long>(std::count(text.begin(), text.end(), '\n'));
    return ends + (text.back() == '\n' ? 0 : 1);
}

std::string dropNotice(unsigned long lines) {
    return "lapdmon: nobody read this stream, lines dropped here: " + std::to_string(lines) + "\n";
}

int timeoutUntil(std::optional<Clock::time_point> limit) {
    if (!limit)
        return forEver;
    const auto left = std::chrono::ceil<milliseconds>(*limit - Clock::now());
    return static_cast<int>(std::max(left, milliseconds::zero()).count());
}

ssize_t writeSomeOf(int descriptor, std::string_view text) {
    return ::write(descriptor, text.data(), std::min(text.size(), largestWrite));
}

bool mayWorkLater(ssize_t written) { return written < 0 && (errno == EAGAIN || errno == EINTR); }

struct Text {
    std::string text;
    unsigned long lines;   // how many lines are missing if it is not written
    unsigned long number;  // its place among the texts of all streams
};

struct Stream {
    int descriptor;
    std::deque<Text> waiting = {};
    std::size_t octets = 0;     // size of the texts that wait
    std::size_t written = 0;    // octets of the first text that are written already
    bool isFull = false;        // takes no text until all texts that wait are written
    unsigned long dropped = 0;  // lines that are missing and of which no notice has told yet
};

}  // namespace

// All functions but awaitWritten take `lock`. The thread does not hold it while it writes.
class StreamWriter::State {
  public:
    State(const std::vector<int>& descriptors, std::size_t bound)
        : bound_(bound), polled_(descriptors.size() + 1) {
        for (const int each : descriptors)
            streams_.push_back({.descriptor = each});
    }
    ~State() { ::close(wakeUp_); }
    State(const State&) = delete;
    State& operator=(const State&) = delete;

    void take(std::size_t stream, std::string_view text);
    void run();  // the thread's body
    void end(milliseconds limit);
    void awaitThread();
    void awaitWritten(milliseconds limit) const;
    void forgetAll(milliseconds limit);

    std::mutex lock;

  private:
    void add(Stream& stream, std::string text, unsigned long lines);
    void addNotice(Stream& stream);
    void removeFirst(Stream& stream);

    bool isDone() const { return limit_ && (waiting_ == 0 || Clock::now() >= *limit_); }
    Stream* awaitRoom(std::unique_lock<std::mutex>& held);
    void writeFirst(Stream& stream, std::unique_lock<std::mutex>& held);
    void writeHere(int descriptor, std::string_view text);
    void wake() const;

    const std::size_t bound_;
    const int wakeUp_ = eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
    std::vector<Stream> streams_;
    std::vector<pollfd> polled_;  // used by the thread only: wakeUp_, then each stream
    unsigned long next_ = 0;
    std::atomic<std::size_t> waiting_ = 0;    // number of texts that wait
    std::optional<Clock::time_point> limit_;  // set when the end begins
    std::atomic<bool> ended_ = false;         // from now on the thread that has a text writes it
    bool left_ = false;                       // the thread has ended
    std::condition_variable leaves_;
};

void StreamWriter::State::take(std::size_t stream, std::string_view text) {
    const std::lock_guard held(lock);
    Stream& to = streams_.at(stream);
    if (text.empty())
        return;
    if (ended_)
        return writeHere(to.descriptor, text);
    try {
        to.isFull = to.isFull || (to.octets != 0 && to.octets + text.size() > bound_);
        if (!to.isFull) {
            addNotice(to);
            return add(to, std::string(text), linesIn(text));
        }
    } catch (const std::bad_alloc&) {  // no memory counts as no room
    }
    to.dropped += linesIn(text);
}

void StreamWriter::State::add(Stream& stream, std::string text, unsigned long lines) {
    const std::size_t size = text.size();
    stream.waiting.push_back({std::move(text), lines, next_++});
    stream.octets += size;
    ++waiting_;
    if (stream.waiting.size() == 1)
        wake();
}

void StreamWriter::State::addNotice(Stream& stream) {
    if (stream.dropped == 0)
        return;
    add(stream, dropNotice(stream.dropped), stream.dropped);
    stream.dropped = 0;
}

void StreamWriter::State::removeFirst(Stream& stream) {
    stream.octets -= stream.waiting.front().text.size();
    stream.written = 0;
    stream.waiting.pop_front();
    if (stream.waiting.empty() && std::exchange(stream.isFull, false)) {
        try {
            addNotice(stream);
        } catch (const std::bad_alloc&) {  // the next text tries again
        }
    }
    --waiting_;
}

void StreamWriter::State::run() {
    std::unique_lock held(lock);
    while (!isDone()) {
        if (Stream* const ready = awaitRoom(held); ready != nullptr && !isDone())
            writeFirst(*ready, held);
    }
    left_ = true;
    leaves_.notify_all();
}

// Waits for a stream that takes text. Returns, of the streams that do, the one whose text came first; null
// when the time is over or the state has changed.
Stream* StreamWriter::State::awaitRoom(std::unique_lock<std::mutex>& held) {
    polled_[0] = {wakeUp_, POLLIN, 0};
    for (std::size_t i = 0; i < streams_.size(); ++i)
        polled_[i + 1] = {streams_[i].waiting.empty() ? -1 : streams_[i].descriptor, POLLOUT, 0};
    const int timeout = timeoutUntil(limit_);
    held.unlock();
    const bool some = poll(polled_.data(), polled_.size(), timeout) > 0;
    // poll looks at one descriptor after the other. If two lead to one pipe, its reader may have made room
    // between the two looks, and a later text would overtake. Once there is room, a second look sees it at
    // both.
    const auto hasNoRoom = [](const pollfd& each) { return each.fd >= 0 && each.revents == 0; };
    if (some && std::any_of(polled_.begin() + 1, polled_.end(), hasNoRoom))
        static_cast<void>(poll(polled_.data(), polled_.size(), 0));
    std::uint64_t wakes = 0;
    if (some && polled_[0].revents != 0)
        static_cast<void>(!read(wakeUp_, &wakes, sizeof wakes));
    held.lock();
    Stream* first = nullptr;
    for (std::size_t i = 0; some && i < streams_.size(); ++i) {
        Stream& stream = streams_[i];
        if (polled_[i + 1].revents != 0 &&
            (first == nullptr || stream.waiting.front().number < first->waiting.front().number))
            first = &stream;
    }
    return first;
}

void StreamWriter::State::writeFirst(Stream& stream, std::unique_lock<std::mutex>& held) {
    const Text& first = stream.waiting.front();  // stays valid, because only this thread removes texts
    const std::string_view rest = std::string_view(first.text).substr(stream.written);
    held.unlock();
    const ssize_t written = writeSomeOf(stream.descriptor, rest);
    const bool later = mayWorkLater(written);
    held.lock();
    if (written > 0)
        stream.written += static_cast<std::size_t>(written);
    else if (!later)
        stream.dropped += first.lines;
    if (stream.written == first.text.size() || (written <= 0 && !later))
        removeFirst(stream);
}

// Writes text on the calling thread, under the lock, and not longer than the limit of the end allows.
void StreamWriter::State::writeHere(int descriptor, std::string_view text) {
    while (!text.empty()) {
        pollfd room{descriptor, POLLOUT, 0};
        const int ready = poll(&room, 1, timeoutUntil(limit_));
        if (ready == 0)
            return;
        const ssize_t written = ready < 0 ? ready : writeSomeOf(descriptor, text);
        if (written > 0)
            text.remove_prefix(static_cast<std::size_t>(written));
        else if (!mayWorkLater(written))
            return;
    }
}

void StreamWriter::State::wake() const {
    const std::uint64_t once = 1;
    static_cast<void>(!::write(wakeUp_, &once, sizeof once));
}

void StreamWriter::State::end(milliseconds limit) {
    std::unique_lock held(lock);
    limit_ = std::min(limit_.value_or(Clock::time_point::max()), Clock::now() + limit);
    wake();
    leaves_.wait_until(held, *limit_, [this] { return left_; });
    ended_ = true;
}

void StreamWriter::State::awaitThread() {
    std::unique_lock held(lock);
    leaves_.wait(held, [this] { return left_; });
}

void StreamWriter::State::awaitWritten(milliseconds limit) const {
    constexpr milliseconds nap{1};
    for (milliseconds waited{0}; waited < limit && waiting_ != 0 && !ended_; waited += nap) {
        const timespec pause{0, std::chrono::nanoseconds(nap).count()};
        nanosleep(&pause, nullptr);
    }
}

void StreamWriter::State::forgetAll(milliseconds limit) {
    for (Stream& each : streams_)
        each.waiting.clear();
    waiting_ = 0;
    left_ = true;
    ended_ = true;
    limit_ = Clock::now() + limit;
}

StreamWriter::StreamWriter(const std::vector<int>& descriptors, std::size_t bound)
    : state_(std::make_shared<State>(descriptors, bound)) {
    std::thread([state = state_] { state->run(); }).detach();
}

StreamWriter::~StreamWriter() {
    end(milliseconds::zero());
    state_->awaitThread();
}

void StreamWriter::write(std::size_t stream, std::string_view text) { state_->take(stream, text); }

void StreamWriter::end(milliseconds limit) { state_->end(limit); }

void StreamWriter::awaitWritten(milliseconds limit) const { state_->awaitWritten(limit); }

void StreamWriter::beforeFork() { state_->lock.lock(); }

void StreamWriter::afterForkInParent() { state_->lock.unlock(); }

void StreamWriter::afterForkInChild(milliseconds limit) {
    state_->forgetAll(limit);
    state_->lock.unlock();
}

}  // namespace app
