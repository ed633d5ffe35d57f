#include "recording/recordings.h"

#include <algorithm>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <map>
#include <regex>
#include <utility>

namespace recording {

namespace {

constexpr char startForm[] = "%Y%m%dT%H%M%SZ";

std::vector<Recording> recordings(const RecordingKind& kind, std::string_view ending) {
    const std::regex rule(R"(\.(\d{8}T\d{6}Z)(?:\.(\d{1,9}))?)" +
                          (kind.mark.empty() ? "" : R"(\.)" + kind.mark) + R"(\.)" + kind.form);
    std::vector<Recording> found;
    std::error_code ignored;
    for (const auto& entry : std::filesystem::directory_iterator(kind.folder, ignored)) {
        std::string name = entry.path().filename();
        if (!name.ends_with(ending))
            continue;
        name.resize(name.size() - ending.size());
        std::smatch part;
        const std::string rest = name.starts_with(kind.trunk) ? name.substr(kind.trunk.size()) : "";
        std::tm start{};
        if (std::regex_match(rest, part, rule) &&
            strptime(part[1].str().c_str(), startForm, &start) != nullptr)
            found.push_back({timegm(&start), part[2].matched ? std::stoi(part[2]) : 1, name});
    }
    std::sort(found.begin(), found.end(), [](const Recording& a, const Recording& b) {
        return a.start != b.start ? a.start < b.start : a.number < b.number;
    });
    return found;
}

}  // namespace

std::string fileNameOf(const std::string& trunk) {
    std::string name = trunk.empty() ? "trunk" : trunk;
    for (char& character : name) {
        const bool isSafe =
            (character >= '0' && character <= '9') || (character >= 'a' && character <= 'z') ||
            (character >= 'A' && character <= 'Z') || std::strchr("-_+@=.", character) != nullptr;
        if (!isSafe || character == '\0')
            character = '_';
    }
    if (name.front() == '.')
        name.front() = '_';
    return name;
}

std::string newRecording(const RecordingKind& kind, std::int64_t start) {
    const std::time_t time = start;
    std::tm utc{};
    gmtime_r(&time, &utc);
    char text[40];
    text[std::strftime(text, sizeof text, startForm, &utc)] = '\0';
    const std::string beginning = kind.folder + "/" + kind.trunk + "." + text;
    const std::string end = (kind.mark.empty() ? "" : "." + kind.mark) + "." + kind.form;
    std::string path = beginning + end;
    for (int i = 2;
         std::filesystem::exists(path) || std::filesystem::exists(path + std::string(unfinishedEnding));
         ++i) {
        path = beginning;
        ((path += '.') += std::to_string(i)) += end;
    }
    return path;
}

std::vector<Recording> finishedRecordings(const RecordingKind& kind) { return recordings(kind, ""); }

std::vector<Recording> unfinishedRecordings(const RecordingKind& kind) {
    return recordings(kind, unfinishedEnding);
}

void putInOrder(std::vector<std::string>& paths) {
    static const std::regex rule(R"((.+)\.(\d{8}T\d{6}Z)(?:\.(\d{1,9}))?\..+)");
    using Begin = std::pair<std::string, int>;  // the start, and the number within its second
    std::map<std::string, std::vector<std::pair<Begin, std::string>>> recordings;  // by trunk
    std::vector<std::string> trunks;  // of each path; empty if it is no recording
    for (const std::string& path : paths) {
        const std::string name = std::filesystem::path(path).filename();
        std::smatch part;
        const bool isRecording = std::regex_match(name, part, rule);
        trunks.push_back(isRecording ? part[1].str() : "");
        if (isRecording)
            recordings[trunks.back()].push_back({{part[2], part[3].matched ? std::stoi(part[3]) : 1}, path});
    }
    for (auto& [trunk, ofTrunk] : recordings) {
        std::stable_sort(ofTrunk.begin(), ofTrunk.end(),
                         [](const auto& a, const auto& b) { return a.first < b.first; });
        auto next = ofTrunk.begin();
        for (std::size_t i = 0; i < paths.size(); ++i) {
            if (trunks[i] == trunk)
                paths[i] = (next++)->second;
        }
    }
}

}  // namespace recording
