#include "Recordings.h"

#include <fcntl.h>
#include <unistd.h>

#include <array>
#include <cstdlib>
#include <stdexcept>

#include "capture/writers.h"

namespace fleet_tests {

namespace {

constexpr std::int64_t november = 1'795'260'333'000'000'000;  // 21 November 2026

}  // namespace

Folder::Folder() {
    std::string name = std::filesystem::temp_directory_path() / "fleet-test.XXXXXX";
    if (mkdtemp(name.data()) == nullptr)
        throw std::runtime_error("no temporary folder");
    path_ = name;
}

Folder::~Folder() { std::filesystem::remove_all(path_); }

Recordings::~Recordings() {
    writer_.reset();
    if (file_ >= 0)
        close(file_);
}

void Recordings::begin(std::uint64_t run, std::uint64_t first) {
    std::string number = std::to_string(names_.size());
    number.insert(0, 6 - number.size(), '0');
    names_.push_back("pri1.20261121T" + number + "Z.pcapng");
    const std::string part = path(names_.back() + ".part");
    file_ = open(part.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0666);
    writer_ = capture::makePcapngWriter(file_, part);
    state_.run = run;
    state_.next = first;
    state_.files.push_back({names_.back(), run, first});
    save();
}

void Recordings::frames(unsigned count) {
    for (; count > 0; --count) {
        const auto number = static_cast<std::uint16_t>(state_.next++);
        const std::array<std::uint8_t, 4> octets{0, 1, static_cast<std::uint8_t>(number >> 8U),
                                                 static_cast<std::uint8_t>(number)};
        capture::Item item;
        item.frame.octets = octets;
        item.frame.interface = &interface_;
        item.frame.clock = capture::Clock::absolute;
        item.frame.time = november + static_cast<std::int64_t>(number) * 1'000'000;
        writer_->write(item);
    }
    writer_->flush();
}

void Recordings::lost(unsigned count) {
    capture::Item item;
    item.kind = capture::Item::Kind::lost;
    item.count = count;
    item.frame.interface = &interface_;
    writer_->write(item);
    writer_->flush();
}

void Recordings::finish() {
    writer_->finish();
    writer_.reset();
    close(file_);
    file_ = -1;
    std::filesystem::rename(path(names_.back() + ".part"), path(names_.back()));
    save();
}

void Recordings::tear() {
    const std::string part = path(names_.back() + ".part");
    frames(1);
    writer_.reset();
    close(file_);
    file_ = -1;
    std::filesystem::resize_file(part, std::filesystem::file_size(part) - 5);
    --state_.next;
    std::filesystem::rename(part, path(names_.back()));
    save();
}

void Recordings::runOutOfRoom(const std::function<void()>& meanwhile,
                              const std::function<void()>& behindTheCut) {
    const std::string part = path(names_.back() + ".part");
    const auto whole = std::filesystem::file_size(part);
    frames(1);
    writer_.reset();
    close(file_);
    file_ = -1;
    std::filesystem::resize_file(part, std::filesystem::file_size(part) - 5);
    meanwhile();
    std::filesystem::resize_file(part, whole);
    behindTheCut();
    std::filesystem::rename(part, path(names_.back()));
    save();
}

void Recordings::remove(std::size_t ago) {
    std::filesystem::remove(path(names_.at(names_.size() - 1 - ago)));
}

void Recordings::save() {
    if (const auto wrong = recording::writeState(state_, recording::statePath(folder_, "pri1")))
        throw std::runtime_error(*wrong);
}

}  // namespace fleet_tests
