// A database of its own for each test, and parcels made of recordings.
#ifndef TESTS_FLEET_STOREFIXTURE_H
#define TESTS_FLEET_STOREFIXTURE_H

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <memory>
#include <pqxx/pqxx>
#include <string>
#include <vector>

#include "capture/open.h"
#include "fleet/Parcel.h"
#include "fleet/store/Inbox.h"
#include "fleet/store/Migrations.h"
#include "fleet/store/Partition.h"
#include "lapdlog/log.h"

namespace fleet {

// The server that tests/fleet/postgres.py has started. libpq takes the last of two values.
inline std::string urlOf(const std::string& database, const std::string& user = "owner") {
    return std::string(std::getenv("STORE_URL")) + "&dbname=" + database + "&user=" + user;
}

// What a command of the shell prints.
inline std::string outputOf(const std::string& command) {
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string text;
    std::array<char, 4096> part{};
    while (const std::size_t size = std::fread(part.data(), 1, part.size(), pipe.get()))
        text.append(part.data(), size);
    return text;
}

class StoreTest : public testing::Test {
  protected:
    StoreTest() : database_("store_" + std::to_string(++databases)) {
        pqxx::connection server(urlOf("postgres"));
        pqxx::nontransaction(server).exec("CREATE DATABASE " + database_);
        owner_ = std::make_unique<pqxx::connection>(url());
        migrate(*owner_);
    }
    ~StoreTest() override {
        owner_.reset();
        pqxx::connection server(urlOf("postgres"));
        pqxx::nontransaction(server).exec("DROP DATABASE " + database_ + " WITH (FORCE)");
    }

    std::string url(const std::string& user = "owner") const { return urlOf(database_, user); }

    // All rows, a line each, fields separated by "|".
    std::string rows(const std::string& select) const {
        pqxx::nontransaction work(*owner_);
        std::string text;
        for (const pqxx::row& row : work.exec(select)) {
            for (const pqxx::field& field : row)
                text += (text.empty() || text.back() == '\n' ? "" : "|") +
                        std::string(field.is_null() ? "-" : field.c_str());
            text += '\n';
        }
        return text;
    }
    void execute(const std::string& sql) const { pqxx::nontransaction(*owner_).exec(sql); }

    // What came of the frames. The numbers of trunks depend on how often their rows were tried.
    std::string everything() const {
        std::string all;
        for (const std::string table : {"trunks", "runs", "frames", "calls", "findings", "gaps"})
            all += rows(
                "SELECT to_jsonb(t) - 'trunk' || (SELECT jsonb_build_object('of', o.site) FROM lapd.trunks o "
                "WHERE o.trunk = t.trunk) FROM lapd." +
                table + " t ORDER BY 1");
        return all;
    }
    void empty() const {
        execute(
            "TRUNCATE lapd.trunks, lapd.runs, lapd.frames, lapd.calls, lapd.findings, lapd.gaps, "
            "lapd.positions, lapd.dead_letters RESTART IDENTITY");
    }

    std::unique_ptr<pqxx::connection> owner_;

  private:
    inline static int databases = 0;
    std::string database_;
};

// Keeps letters until they are acknowledged, as a stream does: what was fetched and not acknowledged comes
// again.
class FakeInbox : public Inbox {
  public:
    void add(const Parcel& parcel) { add(toText(parcel.subject()), toText(parcel)); }
    void add(const std::string& subject, const std::string& text) {
        letters_.push_back({subject, text, ++last_});
    }
    bool isEmpty() const { return letters_.empty(); }
    const std::vector<DeadLetter>& buried() const { return buried_; }
    // At most so many a fetch.
    void hold(std::size_t most) { most_ = most; }

    std::vector<Letter> fetch(std::size_t most, std::chrono::milliseconds /*wait*/) override {
        fetched_ = std::min({most, most_, letters_.size()});
        return {letters_.begin(), letters_.begin() + static_cast<std::ptrdiff_t>(fetched_)};
    }
    void bury(const DeadLetter& dead) override { buried_.push_back(dead); }
    void acknowledge() override {
        letters_.erase(letters_.begin(), letters_.begin() + static_cast<std::ptrdiff_t>(fetched_));
    }

  private:
    std::deque<Letter> letters_;
    std::vector<DeadLetter> buried_;
    std::size_t most_ = 1000;
    std::size_t fetched_ = 0;
    std::uint64_t last_ = 0;
};

inline ParcelItem parcelItemOf(const capture::Item& item) {
    ParcelItem to;
    to.kind = item.kind;
    if (item.frame.clock == capture::Clock::absolute)
        to.time = item.frame.time;
    to.ticks = item.frame.ticks;
    to.written = item.frame.written;
    to.transmitted = item.frame.transmitted;
    to.role = item.frame.role;
    to.octets.assign(item.frame.octets.begin(), item.frame.octets.end());
    to.count = item.count;
    to.text = item.text;
    if (item.kind == capture::Item::Kind::run)
        to.variant = item.frame.interface->variant;
    return to;
}

// The frames of a recording as parcels of at most `most` frames. The last one ends the run, if asked for.
inline std::vector<Parcel> parcelsOf(const std::string& file, std::size_t most, bool ends = false,
                                     const std::string& site = "london") {
    std::vector<capture::Form> forms{lapdlog::logForm};
    forms.insert(forms.end(), capture::forms().begin(), capture::forms().end());
    const auto reader = capture::openReader(file, {}, forms);
    Parcel parcel;
    parcel.address = {site, "h1", "0", "1"};
    parcel.run = 1795260333000001;
    std::vector<Parcel> parcels;
    std::vector<ParcelItem> before;
    capture::Item item;
    while (reader->next(item) == capture::Reader::Next::item) {
        if (item.kind != capture::Item::Kind::frame && item.kind != capture::Item::Kind::oversized) {
            before.push_back(parcelItemOf(item));
            continue;
        }
        if (parcel.frames.size() == most) {
            parcels.push_back(parcel);
            parcel.first += parcel.frames.size();
            parcel.frames.clear();
        }
        parcel.trunk = item.frame.interface->name;
        parcel.variant = item.frame.interface->variant;
        parcel.frames.push_back({parcelItemOf(item), std::move(before)});
        before.clear();
    }
    if (ends)
        parcel.end = before;
    parcels.push_back(parcel);
    return parcels;
}

}  // namespace fleet

#endif
