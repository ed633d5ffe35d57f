// No six digits of a number get through, wherever they stand and however they are coded.
#include <gtest/gtest.h>

#include "tests/redaction/Strangers.h"

namespace redaction {
namespace {

using isdn::Variant;
using test::Bytes;
using test::Stranger;

constexpr Variant variants[] = {Variant::net5, Variant::ni2,    Variant::ess4,
                                Variant::ess5, Variant::dms100, Variant::ntt};
constexpr unsigned framesEach = 2'500;

TEST(Strangers, leaveNoSixDigitsInAFrame) {
    test::ConstantPseudonyms constant;
    unsigned seed = 0;
    std::size_t leaks = 0;
    for (const Variant variant : variants) {
        for (unsigned i = 0; i < framesEach; ++i) {
            const Stranger stranger = test::strangerOf(++seed, variant);
            const Bytes after = test::redacted({{stranger.octets, false}}, constant, variant)[0].octets;
            const std::string digits = test::sixDigitsIn(stranger, after);
            if (!digits.empty() && ++leaks < 400)
                ADD_FAILURE() << stranger.says << ": " << digits << "\n  " << test::textOf(stranger.octets)
                              << "\n  " << test::textOf(after);
        }
    }
    EXPECT_EQ(leaks, 0U);
}

// A redacted frame can be undone only if it is read as the original is.
TEST(Strangers, areReadAsBeforeOnceTheyAreRedacted) {
    test::ConstantPseudonyms constant;
    unsigned seed = 0;
    for (const Variant variant : variants) {
        for (unsigned i = 0; i < framesEach; ++i) {
            const Stranger stranger = test::strangerOf(++seed, variant);
            const Bytes after = test::redacted({{stranger.octets, false}}, constant, variant)[0].octets;
            ASSERT_EQ(planOfFrame(after, variant), planOfFrame(stranger.octets, variant))
                << stranger.says << "\n  " << test::textOf(stranger.octets) << "\n  " << test::textOf(after);
        }
    }
}

}  // namespace
}  // namespace redaction
