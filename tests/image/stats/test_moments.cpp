// Moments against exact sums about shifted origins, the row partial-sum
// order, the state's lifecycle, variant agreement and the check orders.
#include <random>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Moments : public zt::VariantTest {};

int64_t ipow(int64_t b, int e) { return e ? b * ipow(b, e - 1) : 1; }

// Integer pixels on small ROIs: every sum is exact in double.
TEST_P(Moments, MatchExactSums) {
    const auto& z = this->z();
    std::mt19937 rng(variant());
    MomentState* st = nullptr;
    double v;
    ASSERT_EQ(z.zoriMomentInitAlloc_64f(&st, 7), StatusOk);
    EXPECT_EQ(z.zoriGetSpatialMoment_64f(st, 0, 0, 0, {0, 0}, &v), StatusBadChannelIndex);  // nothing computed yet
    for (ImageSize r : {ImageSize{1, 1}, ImageSize{6, 3}, ImageSize{37, 9}}) {
        zt::GuardedImage<float> img(r.width, r.height, 0, 4);
        img.fill([&](int, int) { return float(int(rng() % 511) - 255); });
        ASSERT_EQ(z.zoriMoments64f_32f_C1R(img.roi(), img.step(), r, st), StatusOk);
        for (int m = 0; m <= 3; ++m)
            for (int n = 0; m + n <= 3; ++n) {
                const ImagePoint o{int(rng() % 50) - 25, int(rng() % 50) - 25};
                int64_t e = 0;
                for (int y = 0; y < r.height; ++y)
                    for (int x = 0; x < r.width; ++x) e += ipow(x + o.x, m) * ipow(y + o.y, n) * int64_t(*img.at(x, y));
                ASSERT_EQ(z.zoriGetSpatialMoment_64f(st, m, n, 0, o, &v), StatusOk);
                EXPECT_EQ(v, double(e)) << m << n;
            }
    }
    EXPECT_TRUE(st->id == 33 && st->hint == 7 && st->channels == 1);
    // columns 0 and 4 share a partial sum, 1 and 3 each have their own
    const float row[5] = {9007199254740992.0f, 1, 0, 1, 1};
    ASSERT_EQ(z.zoriMoments64f_32f_C1R(row, 20, {5, 1}, st), StatusOk);
    EXPECT_EQ(st->moments[0][0], 9007199254740994.0);
    MomentState bad = *st;
    bad.id = 34;
    const ImageSize r{2, 2};
    zt::expectChecks(z.zoriMoments64f_32f_C1R, {row, 8, r, st}, {zt::watch(st, sizeof *st)}, zt::eachNull(),
                     zt::bad(StatusContextMismatch, zt::arg<3>(&bad), zt::arg<1>(0)),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<2>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{1, 0})), zt::bad(StatusStepBelowRow, zt::arg<1>(7)));
    zt::expectChecks(z.zoriGetSpatialMoment_64f, {st, 1, 2, 0, {1, 1}, &v}, {zt::watch(&v, 8)}, zt::eachNull(),
                     zt::bad(StatusContextMismatch, zt::arg<0>(&bad), zt::arg<1>(3)),
                     zt::bad(StatusBadSize, zt::arg<2>(3), zt::arg<3>(1)), zt::bad(StatusBadSize, zt::arg<1>(-1)),
                     zt::bad(StatusBadChannelIndex, zt::arg<3>(1)), zt::bad(StatusBadChannelIndex, zt::arg<3>(-1)));
    EXPECT_TRUE(z.zoriMomentInitAlloc_64f(nullptr, 0) == StatusNullPointer && z.zoriMomentFree_64f(nullptr) == StatusNullPointer);
    EXPECT_EQ(z.zoriMomentFree_64f(&bad), StatusContextMismatch);
    EXPECT_EQ(z.zoriMomentFree_64f(st), StatusOk);
}

TEST_P(Moments, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const auto img = c.inImage<float>(c.roi().width, c.roi().height);
        MomentState* st = c.out<MomentState>(1);
        st->id = MomentStateId;
        return z.zoriMoments64f_32f_C1R(img.p, img.step, c.roi(), st);
    });
}

}  // namespace

ZT_ALL_VARIANTS(Moments);
