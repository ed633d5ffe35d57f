#include "NatsServer.h"

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <fstream>
#include <stdexcept>

namespace fleet_tests {

namespace {

std::filesystem::path temporaryFolder() {
    std::string name = std::filesystem::temp_directory_path() / "fleet-test.XXXXXX";
    if (mkdtemp(name.data()) == nullptr)
        throw std::runtime_error("no temporary folder");
    return name;
}

// Reads the server's standard error stream up to a line that holds the words; returns all that was read.
std::string readUntil(int descriptor, const std::string& words) {
    std::string all;
    char piece[4096];
    while (all.find(words) == std::string::npos) {
        const ssize_t size = read(descriptor, piece, sizeof piece);
        if (size <= 0)
            throw std::runtime_error("nats-server has ended: " + all);
        all.append(piece, static_cast<std::size_t>(size));
    }
    return all;
}

void run(const std::string& command) {
    if (std::system(command.c_str()) != 0)  // NOLINT(cert-env33-c): a script of ours
        throw std::runtime_error(command + " failed");
}

}  // namespace

const Certificates& Certificates::get() {
    static const Certificates certificates;
    return certificates;
}

Certificates::Certificates() : folder_(temporaryFolder()), strangers_(temporaryFolder()) {
    const std::string script = LAPDMON_SOURCE_DIR "/scripts/fleet-certificates ";
    run(script + folder_.string() +
        " server:127.0.0.1,localhost client:admin client:leeds client:shipper client:store");
    run(script + strangers_.string() + " client:store");
}

Certificates::~Certificates() {
    std::filesystem::remove_all(folder_);
    std::filesystem::remove_all(strangers_);
}

NatsServer::NatsServer(Security security) : security_(security), folder_(temporaryFolder()) { start(); }

NatsServer::~NatsServer() {
    kill();
    std::filesystem::remove_all(folder_);
}

void NatsServer::writeConfiguration() const {
    std::ofstream to(folder_ / "server.conf");
    to << "listen: \"127.0.0.1:" << port_ << "\"\njetstream { store_dir: \"" << folder_.string()
       << "/store\" }\n";
    if (security_ == Security::none)
        return;
    const Certificates& files = Certificates::get();
    to << "tls { cert_file: \"" << files.file("127.0.0.1.pem") << "\", key_file: \""
       << files.file("127.0.0.1.key") << "\", ca_file: \"" << files.file("authority.pem")
       << "\", verify_and_map: true }\n"
       << R"(authorization { users: [
    { user: admin }
    { user: leeds, permissions: { publish: [ "lapd.*.leeds.>", "$JS.API.STREAM.INFO.LAPD_SITE" ],
                                  subscribe: "_INBOX.>" } }
    { user: shipper, permissions: { publish: [ "lapd.>", "$JS.API.STREAM.INFO.LAPD_SITE" ],
                                    subscribe: "_INBOX.>" } }
    { user: store, permissions: { publish: [ "$JS.API.CONSUMER.DURABLE.CREATE.LAPD.*",
                                             "$JS.API.CONSUMER.CREATE.LAPD.>", "$JS.API.CONSUMER.INFO.LAPD.*",
                                             "$JS.API.CONSUMER.MSG.NEXT.LAPD.*", "$JS.API.STREAM.INFO.LAPD",
                                             "$JS.ACK.>", "lapd-dead.>" ],
                                  subscribe: "_INBOX.>" } } ] }
)";
}

void NatsServer::start() {
    writeConfiguration();
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0)
        throw std::runtime_error("no pipe");
    const std::string configuration = folder_ / "server.conf";
    process_ = fork();
    if (process_ == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        dup2(ends[1], STDERR_FILENO);
        execlp("nats-server", "nats-server", "-c", configuration.c_str(), nullptr);
        _exit(127);
    }
    close(ends[1]);
    said_ = ends[0];
    const std::string said = readUntil(said_, "Server is ready");
    const std::string before = "client connections on 127.0.0.1:";
    port_ = std::atoi(said.c_str() + said.find(before) + before.size());  // NOLINT(cert-err34-c)
}

void NatsServer::kill() {
    if (process_ < 0)
        return;
    ::kill(process_, SIGKILL);
    waitpid(process_, nullptr, 0);
    process_ = -1;
    close(said_);
}

void NatsServer::lose() const { std::filesystem::remove_all(folder_ / "store"); }

void NatsServer::freeze() { ::kill(process_, SIGSTOP); }
void NatsServer::thaw() { ::kill(process_, SIGCONT); }

fleet::NatsOptions NatsServer::options(const std::string& user) const {
    fleet::NatsOptions options;
    const bool isSecure = security_ == Security::certificates;
    options.servers = {(isSecure ? "tls://127.0.0.1:" : "nats://127.0.0.1:") + std::to_string(port_)};
    options.name = "test";
    if (isSecure) {
        const Certificates& files = Certificates::get();
        options.authority = files.file("authority.pem");
        options.certificate = files.file(user + ".pem");
        options.key = files.file(user + ".key");
    }
    return options;
}

}  // namespace fleet_tests
