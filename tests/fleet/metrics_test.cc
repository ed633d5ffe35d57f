// Figures as Prometheus reads them, and the small server that hands them out.
#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <chrono>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "fleet/metrics/Exposition.h"
#include "fleet/metrics/HttpAnswerer.h"
#include "fleet/metrics/Published.h"

namespace {

using namespace std::chrono_literals;
using fleet::Exposition;
using fleet::HttpAnswerer;

constexpr int longEnough = 60'000;  // milliseconds; ends a test that would wait for ever

// A client that does what it is told.
class Client {
  public:
    explicit Client(const HttpAnswerer& server) : socket_(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        const std::string& text = server.address();
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        address.sin_port = htons(static_cast<std::uint16_t>(std::stoul(text.substr(text.find(':') + 1))));
        EXPECT_EQ(connect(socket_, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
    }
    ~Client() { close(socket_); }
    Client(const Client&) = delete;
    Client& operator=(const Client&) = delete;

    void say(const std::string& text) const { send(socket_, text.data(), text.size(), MSG_NOSIGNAL); }
    // What comes until the server closes.
    std::string rest() const {
        std::string all;
        char part[4096];
        pollfd readable{socket_, POLLIN, 0};
        while (poll(&readable, 1, longEnough) == 1) {
            const ssize_t got = recv(socket_, part, sizeof part, 0);
            if (got <= 0)
                return all;
            all.append(part, static_cast<std::size_t>(got));
        }
        ADD_FAILURE() << "the server does not close";
        return all;
    }
    std::string ask(const std::string& text) const {
        say(text);
        return rest();
    }

  private:
    int socket_;
};

std::string figures() { return "frames 1\n"; }

constexpr char asked[] = "GET /metrics HTTP/1.1\r\nHost: x\r\n\r\n";
const std::string answered =
    "HTTP/1.1 200 OK\r\nContent-Length: 9\r\nConnection: close\r\n"
    "Content-Type: text/plain; version=0.0.4; charset=utf-8\r\n\r\nframes 1\n";

}  // namespace

TEST(Exposition, WritesFamiliesAndSamplesAsTheTextFormSays) {
    Exposition to;
    to.single("frames_total", Exposition::Type::counter, "Frames.", std::uint64_t{18446744073709551615U});
    to.family("lag_seconds", Exposition::Type::gauge, "Lag.");
    to.sample({{"site", "a"}, {"name", "b \\ \"c\"\n"}}, 0.25);
    to.sample({{"site", ""}}, 0.0);
    EXPECT_EQ(to.text(),
              "# HELP frames_total Frames.\n"
              "# TYPE frames_total counter\n"
              "frames_total 18446744073709551615\n"
              "# HELP lag_seconds Lag.\n"
              "# TYPE lag_seconds gauge\n"
              "lag_seconds{site=\"a\",name=\"b \\\\ \\\"c\\\"\\n\"} 0.25\n"
              "lag_seconds{site=\"\"} 0\n");
}

TEST(HttpAnswerer, KnowsWhatIsAnAddress) {
    for (const char* const good : {"9470", "127.0.0.1:9470", "0.0.0.0:0", "[::1]:9470", "[::]:1"})
        EXPECT_TRUE(fleet::isListenAddress(good)) << good;
    for (const char* const bad :
         {"", ":", ":9470", "localhost:9470", "127.0.0.1", "127.0.0.1:", "127.0.0.1:65536", "127.0.0.1:-1",
          "::1:9470", "[]:1", "127.0.0.1:94 70", "1:2:3"})
        EXPECT_FALSE(fleet::isListenAddress(bad)) << bad;
}

TEST(HttpAnswerer, AnswersWhoAsksForFiguresAndNobodyElse) {
    const HttpAnswerer server("0", figures);
    EXPECT_EQ(server.address().substr(0, 10), "127.0.0.1:");
    const struct {
        const char* says;
        std::string begins;
    } table[] = {
        {asked, answered},
        {"GET /metrics?a=b HTTP/1.0\r\n\r\n", answered},
        {"GET /metrics HTTP/1.1\n\n", answered},
        {"HEAD /metrics HTTP/1.1\r\n\r\n", answered.substr(0, answered.size() - 9)},
        {"GET / HTTP/1.1\r\n\r\n", "HTTP/1.1 404 "},
        {"POST /metrics HTTP/1.1\r\n\r\n", "HTTP/1.1 405 "},
        {"GET /metrics\r\n\r\n", "HTTP/1.1 400 "},
        {"\r\n\r\n", "HTTP/1.1 400 "},
        {" \xff \r\n\r\n", "HTTP/1.1 400 "},
    };
    for (const auto& row : table) {
        const std::string all = Client(server).ask(row.says);
        EXPECT_EQ(all.substr(0, row.begins.size()), row.begins) << row.says;
        if (row.begins.find("\r\n\r\n") != std::string::npos) {
            EXPECT_EQ(all, row.begins) << row.says;
        }
    }
}

TEST(HttpAnswerer, TakesARequestInPieces) {
    const HttpAnswerer server("0", figures);
    const Client client(server);
    for (const char* c = asked; *c != '\0'; ++c)
        client.say({c, 1});
    EXPECT_EQ(client.rest(), answered);
}

TEST(HttpAnswerer, RefusesARequestThatDoesNotEnd) {
    fleet::HttpLimits limits;
    limits.mostOctets = 1000;
    const HttpAnswerer server("0", figures, limits);
    EXPECT_EQ(Client(server).ask("GET /metrics HTTP/1.1\r\nX: " + std::string(2000, 'x')).substr(0, 13),
              "HTTP/1.1 431 ");
    EXPECT_EQ(Client(server).ask(asked), answered);
}

TEST(HttpAnswerer, IsNotHeldUpByClientsThatSayNothing) {
    fleet::HttpLimits limits;
    limits.mostConnections = 4;
    limits.patience = 24h;
    const HttpAnswerer server("0", figures, limits);
    std::vector<std::unique_ptr<Client>> silent;
    for (int i = 0; i < 20; ++i) {
        silent.push_back(std::make_unique<Client>(server));
        silent.back()->say("GET /met");
    }
    EXPECT_EQ(Client(server).ask(asked), answered);
    // Those for which there was no more room were ended; nobody is asked for it.
    EXPECT_EQ(silent.front()->rest(), "");
}

TEST(HttpAnswerer, EndsAConnectionWhosePatienceIsOver) {
    fleet::HttpLimits limits;
    limits.patience = 50ms;
    const HttpAnswerer server("0", figures, limits);
    const Client client(server);
    client.say("GET /metrics HTTP/1.1\r\n");
    EXPECT_EQ(client.rest(), "");
}

TEST(HttpAnswerer, IsNotHeldUpByAClientThatReadsNothing) {
    const std::string much(20'000'000, 'x');
    const HttpAnswerer server("0", [&] { return much; });
    const Client unread(server);
    unread.say(asked);
    EXPECT_EQ(Client(server).ask(asked).size(), much.size() + answered.size() - 9 + 7);
}

TEST(HttpAnswerer, AnswersWithAnErrorIfThereAreNoFigures) {
    const HttpAnswerer server("0", []() -> std::string { throw std::runtime_error("none"); });
    EXPECT_EQ(Client(server).ask(asked).substr(0, 13), "HTTP/1.1 500 ");
}

TEST(HttpAnswerer, SaysWhyItCannotListen) {
    const HttpAnswerer first("0", figures);
    EXPECT_THROW(HttpAnswerer(first.address(), figures), fleet::BadListenAddress);
    EXPECT_THROW(HttpAnswerer("192.0.2.1:0", figures), fleet::BadListenAddress);
    EXPECT_THROW(HttpAnswerer("nowhere:1", figures), fleet::BadListenAddress);
}

TEST(Published, HandsOutWhatWasSetLast) {
    fleet::Published text;
    EXPECT_EQ(text.get(), "");
    text.set("1");
    text.set("2");
    EXPECT_EQ(text.get(), "2");
}
