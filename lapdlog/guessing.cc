#include "lapdlog/guessing.h"

#include <algorithm>

#include "lapdlog/variants.h"

namespace lapdlog {

namespace {

using capture::Variant;

constexpr int mostFrames = 1000;

}  // namespace

std::vector<Variant> variantsThatFit(std::string_view text, Prover& prover, bool isAll, std::size_t untitled,
                                     bool& mayCome) {
    std::vector<Variant> fitting(allVariants.begin(), allVariants.end());
    mayCome = false;
    for (int frames = 0; frames < mostFrames; ++frames) {
        Header header;
        const Reading read = readHeader(text, header);
        std::vector<Variant> stillFitting;
        std::size_t size = 0;
        for (const Variant variant : read == Reading::good ? fitting : std::vector<Variant>()) {
            const Prover::Proof proof =
                prover.prove(text.substr(header.size), header.transmitted, variant, isAll,
                             frames == 0 ? untitled - std::min(untitled, header.size) : 0);
            mayCome = mayCome || (frames == 0 && proof.reading == Reading::cut);
            if (proof.reading == Reading::good) {
                stillFitting.push_back(variant);
                size = header.size + proof.size;
            }
        }
        if (stillFitting.empty())
            return frames == 0 ? stillFitting : fitting;
        fitting = std::move(stillFitting);
        if (fitting.size() == 1)
            break;
        text.remove_prefix(size);
    }
    return fitting;
}

Variant likeliestOf(const std::vector<Variant>& variants) {
    const auto found = std::find(variants.begin(), variants.end(), Variant::net5);
    return found == variants.end() ? variants.front() : *found;
}

std::string saying(const std::vector<Variant>& variants) {
    std::string names;
    for (const Variant variant : variants)
        names += (names.empty() ? "" : ", ") + std::string(variantName(variant));
    return "the log has no head, and its text fits several variants (" + names + "); " +
           std::string(variantName(likeliestOf(variants))) + " is taken";
}

}  // namespace lapdlog
