// Moments against exact sums about shifted origins, the row partial-sum
// order, the state's lifecycle, variant agreement and the check orders.
#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Moments : public zt::VariantTest {};

// Integer pixels on small ROIs: every sum is exact in double.
TEST_P(Moments, MatchExactSums) {
    const auto& z = this->z();
    std::mt19937 rng(variant());
    MomentState *st = nullptr, wrong{34, 7, 1, 0, {}};  // wrong: an identifier other than 33
    double v;
    auto pow = [](double b, int e) { return e ? b * (e > 1 ? b : 1) * (e > 2 ? b : 1) : 1.0; };
    ASSERT_TRUE(z.zoriMomentInitAlloc_64f(&st, 7) == StatusOk &&  // nothing computed yet: no channel
                z.zoriGetSpatialMoment_64f(st, 0, 0, 0, {0, 0}, &v) == StatusBadChannelIndex);
    for (ImageSize r : {ImageSize{1, 1}, ImageSize{6, 3}, ImageSize{37, 9}}) {
        zt::GuardedImage<float> img(r.width, r.height, 0, 4);
        img.fill([&](int, int) { return float(int(rng() % 511) - 255); });
        ASSERT_EQ(z.zoriMoments64f_32f_C1R(img.roi(), img.step(), r, st), StatusOk);
        for (int m = 0; m <= 3; ++m)
            for (int n = 0; m + n <= 3; ++n) {
                const ImagePoint o{int(rng() % 50) - 25, int(rng() % 50) - 25};
                double e = 0;
                for (int y = 0; y < r.height; ++y)
                    for (int x = 0; x < r.width; ++x) e += pow(x + o.x, m) * pow(y + o.y, n) * *img.at(x, y);
                EXPECT_TRUE(z.zoriGetSpatialMoment_64f(st, m, n, 0, o, &v) == StatusOk && v == e) << m << n;
            }
    }
    // columns 0 and 4 share a partial sum, 1 and 3 each have their own
    const float row[5] = {9007199254740992.0f, 1, 0, 1, 1};
    EXPECT_TRUE(z.zoriMoments64f_32f_C1R(row, 20, {5, 1}, st) == StatusOk &&
                st->moments[0][0] == 9007199254740994.0 && st->id == 33 && st->hint == 7 && st->channels == 1);
    using zt::arg, zt::bad;
    zt::expectChecks(z.zoriMoments64f_32f_C1R, {row, 8, {2, 2}, st}, {zt::watch(st, sizeof *st)}, zt::eachNull(),
                     bad(StatusContextMismatch, arg<3>(&wrong), arg<1>(0)), bad(StatusStepBelowRow, arg<1>(7)),
                     bad(StatusBadStep, arg<1>(0), arg<2>(ImageSize{0, 0})), bad(StatusBadSize, arg<2>(ImageSize{1, 0})));
    zt::expectChecks(z.zoriGetSpatialMoment_64f, {st, 1, 2, 0, {1, 1}, &v}, {zt::watch(&v, 8)}, zt::eachNull(),
                     bad(StatusContextMismatch, arg<0>(&wrong), arg<1>(3)), bad(StatusBadSize, arg<1>(-1)),
                     bad(StatusBadSize, arg<2>(3), arg<3>(1)), bad(StatusBadChannelIndex, arg<3>(1)));
    EXPECT_TRUE(z.zoriMomentFree_64f(&wrong) == StatusContextMismatch && z.zoriMomentFree_64f(nullptr) == StatusNullPointer &&
                z.zoriMomentInitAlloc_64f(nullptr, 0) == StatusNullPointer && z.zoriMomentFree_64f(st) == StatusOk);
}

TEST_P(Moments, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const auto img = c.inImage<float>(c.roi().width, c.roi().height);
        MomentState* st = c.out<MomentState>(1);  // the pattern it starts with, but for the identifier
        return st->id = MomentStateId, z.zoriMoments64f_32f_C1R(img.p, img.step, c.roi(), st);
    });
}

}  // namespace

ZT_ALL_VARIANTS(Moments);
