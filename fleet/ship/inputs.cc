#include "fleet/ship/inputs.h"

#include <vector>

#include "capture/open.h"
#include "lapdlog/log.h"

namespace fleet {

std::unique_ptr<capture::Reader> openInput(const std::string& path, Manner manner, const std::string& trunk) {
    static const std::vector<capture::Form> forms = [] {
        std::vector<capture::Form> all{lapdlog::logForm};
        all.insert(all.end(), capture::forms().begin(), capture::forms().end());
        return all;
    }();
    capture::ReadOptions options;
    options.follow = manner == Manner::follow;
    options.trunk = trunk;
    return capture::openReader(path, options, forms);
}

}  // namespace fleet
