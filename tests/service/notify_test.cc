#include "service/notify.h"

#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <string>

namespace {

// Stands in for the service manager: an abstract socket that NOTIFY_SOCKET names while it lives.
class Manager {
  public:
    Manager() : name_("lapdmon-test-" + std::to_string(getpid())), socket_(socket(AF_UNIX, SOCK_DGRAM, 0)) {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        std::memcpy(address.sun_path + 1, name_.data(), name_.size());
        const auto size = static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + 1 + name_.size());
        EXPECT_EQ(bind(socket_, reinterpret_cast<const sockaddr*>(&address), size), 0);
        setenv("NOTIFY_SOCKET", ("@" + name_).c_str(), 1);
    }
    ~Manager() {
        for (const char* name : {"NOTIFY_SOCKET", "WATCHDOG_USEC", "WATCHDOG_PID"})
            unsetenv(name);
        close(socket_);
    }
    Manager(const Manager&) = delete;
    Manager& operator=(const Manager&) = delete;

    // The next line that has come; empty if none has. A datagram is there as soon as it has been sent.
    std::string heard() const {
        std::string line(100, '\0');
        const ssize_t size = recv(socket_, line.data(), line.size(), MSG_DONTWAIT);
        line.resize(size < 0 ? 0 : static_cast<std::size_t>(size));
        return line;
    }

  private:
    std::string name_;
    int socket_;
};

TEST(Notify, SendsTheLineToTheServiceManager) {
    const Manager manager;
    service::notify("READY=1");
    EXPECT_EQ(manager.heard(), "READY=1");
}

TEST(Notify, SendsNothingWithoutAServiceManager) {
    const Manager manager;
    unsetenv("NOTIFY_SOCKET");
    service::notify("READY=1");
    EXPECT_EQ(manager.heard(), "");
}

TEST(Heartbeat, BeatsThreeTimesInTheTimeAllowed) {
    const Manager manager;
    setenv("WATCHDOG_USEC", "90000000", 1);
    setenv("WATCHDOG_PID", std::to_string(getpid()).c_str(), 1);
    service::Heartbeat heartbeat;
    EXPECT_EQ(heartbeat.interval(), std::chrono::seconds(30));
    heartbeat.beat();
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
}

TEST(Heartbeat, DoesNotBeatAgainBeforeHalfOfTheInterval) {
    const Manager manager;
    setenv("WATCHDOG_USEC", "90000000", 1);
    service::Heartbeat heartbeat;
    heartbeat.beat();
    heartbeat.beat();
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
    EXPECT_EQ(manager.heard(), "");
}

TEST(Heartbeat, DoesNotWaitForAServiceManagerThatReadsNothing) {
    const Manager manager;
    setenv("WATCHDOG_USEC", "3000", 1);  // each call may beat
    service::Heartbeat heartbeat;
    constexpr int calls = 10000;  // more than the socket of any manager holds
    for (int call = 0; call < calls; ++call)
        heartbeat.beat();
    int heard = 0;
    while (manager.heard() == "WATCHDOG=1")
        ++heard;
    EXPECT_GT(heard, 0);
    EXPECT_LT(heard, calls);
    heartbeat.beat();
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
}

TEST(Heartbeat, BeatsForNobodyButTheProcessThatIsWatched) {
    const Manager manager;
    setenv("WATCHDOG_USEC", "90000000", 1);
    setenv("WATCHDOG_PID", std::to_string(getppid()).c_str(), 1);
    service::Heartbeat heartbeat;
    EXPECT_EQ(heartbeat.interval(), std::nullopt);
    heartbeat.beat();
    EXPECT_EQ(manager.heard(), "");
}

TEST(Heartbeat, IgnoresATimeThatIsNoNumber) {
    const Manager manager;
    for (const char* time : {"", "0", "-1", "soon", "9 s", "99999999999999999999999"}) {
        setenv("WATCHDOG_USEC", time, 1);
        EXPECT_EQ(service::Heartbeat().interval(), std::nullopt) << time;
    }
}

}  // namespace
