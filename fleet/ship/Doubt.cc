#include "fleet/ship/Doubt.h"

#include <fstream>
#include <utility>

#include "recording/files.h"

namespace fleet {

Doubt::Doubt(std::string path, std::chrono::milliseconds calm) : path_(std::move(path)), calm_(calm) {
    std::ifstream file(path_);
    std::getline(file, trusted_);
}

void Doubt::connectedTo(const std::string& process, Clock::time_point now) {
    if (process.empty() || std::exchange(connected_, process) == process)
        return;
    if (trusted_.empty())
        end();
    else if (process != trusted_)
        raise(now);
}

// If the file cannot be written, the next shipper doubts without need, and sends some frames twice.
void Doubt::end() {
    raised_.reset();
    if (std::exchange(trusted_, connected_) != connected_)
        recording::replaceFile(path_, trusted_ + "\n");
}

}  // namespace fleet
