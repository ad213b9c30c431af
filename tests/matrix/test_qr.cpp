// QR decomposition and solve: the least-squares condition in double, the
// reflections the definition pins, the stop, the checks, the variants.
#include <numeric>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class QR : public zt::VariantTest {};

// x from the decomposition solves the least-squares problem: A'(A x - b) = 0.
TEST_P(QR, FactorsAndSolves) {
    std::mt19937 rng(5);
    for (int h = 1; h <= 11; ++h)
        for (int w = 1; w <= h; ++w) {
            std::vector<double> a(w * h), d(w * h * 3), buf(h), b(h * 2), x(w), g(w);  // d: strides 24 w and 24
            for (auto* v : {&a, &b}) for (double& e : *v) e = int(rng() % 2001) - 1000;
            ASSERT_EQ(z().zormQRDecomp_m_64f(a.data(), 8 * w, 8, buf.data(), d.data(), 24 * w, 24, w, h) |
                      z().zormQRBackSubst_mv_64f(d.data(), 24 * w, 24, buf.data(), b.data(), 16, x.data(), 8, w, h), 0);
            for (int i = 0; i < h; ++i) {
                const double r = std::inner_product(&a[i * w], &a[i * w] + w, x.data(), -b[i * 2]);
                for (int j = 0; j < w; ++j) g[j] += a[i * w + j] * r;
            }
            for (int j = 0; j < w; ++j) ASSERT_NEAR(g[j], 0, 1e-4) << w << "x" << h;
        }
}

// Zero leads of either sign reflect like negative ones; a column norm of the
// epsilon passes, anything less stops after the copy.
TEST_P(QR, PinnedReflectionsAndStop) {
    double buf[3], d[9], x[3], id[9] = {1, 0, 0, 0, 1, 0, 0, 0, 1}, b[3] = {2, -3, 5};
    ASSERT_EQ(z().zormQRDecomp_m_64f_3x3(id, 24, buf, d, 24) | z().zormQRBackSubst_mv_64f_3x3(d, 24, buf, b, x), 0);
    EXPECT_EQ(std::vector<double>(d, d + 9), std::vector<double>({-1, 0, 0, 0, -1, 0, 0, 0, 1}));
    EXPECT_EQ(std::vector<double>(x, x + 3), std::vector<double>(b, b + 3));
    const double e = 2.220446049250313e-16, c[5][3] = {{0.0, 3, 4}, {-0.0, 3, 4}, {1e-300, 3, 4}, {e}, {e * 0.99}}, r[5] = {5, 5, -5, -e, e * 0.99};
    for (int k = 0; k < 5; ++k)
        EXPECT_TRUE(z().zormQRDecomp_m_64f(c[k], 8, 8, buf, d, 8, 8, 1, 3) == (k < 4 ? 0 : -10) && d[0] == r[k]) << k;
}

TEST_P(QR, Checks) {
    double m[12] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12}, buf[4], out[12], x[3];
    float f[4] = {1, 2, 3, 4}, g[4];
    zt::expectChecks(z().zormQRDecomp_m_64f, {m, 24, 8, buf, out, 24, 8, 3, 4}, {zt::watch(out, sizeof out)}, zt::eachNull(),
                     zt::bad(-6, zt::arg<8>(0), zt::arg<1>(12)), zt::bad(-182, zt::arg<1>(12), zt::arg<7>(5)), zt::bad(-182, zt::arg<6>(0)),
                     zt::bad(-204, zt::arg<7>(5)), zt::bad(-8, zt::arg<3>(nullptr), zt::arg<7>(0)));
    zt::expectChecks(z().zormQRBackSubst_mv_64f, {m, 24, 8, buf, m, 8, x, 8, 3, 4}, {zt::watch(x, sizeof x)}, zt::eachNull(),
                     zt::bad(-6, zt::arg<9>(0), zt::arg<5>(4)), zt::bad(-182, zt::arg<7>(-8), zt::arg<8>(5)), zt::bad(-204, zt::arg<8>(5)));
    zt::expectChecks(z().zormMul_vc_32f, {f, 4, 2.5f, g, 8, 2}, {zt::watch(g, sizeof g)}, zt::eachNull(),
                     zt::bad(-6, zt::arg<5>(0), zt::arg<1>(2)), zt::bad(-182, zt::arg<1>(2)), zt::bad(-182, zt::arg<4>(-4)));
    EXPECT_EQ(g[2], 5.0f);  // element 1, at stride 8
}

TEST_P(QR, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const int h = c.roi().height + 4, w = h - c.index() % 3;
        double *a = c.in<double>(size_t(w) * h * 2, -9, 9), *d = c.out<double>(size_t(w) * h), *x = c.out<double>(w);
        return z.zormQRDecomp_m_64f(a, 16 * w, 16, c.out<double>(h), d, 8 * w, 8, w, h) |
               z.zormQRBackSubst_mv_64f(d, 8 * w, 8, c.out<double>(h), a, 8, x, 8, w, h) |
               z.zormMul_vc_32f(c.in<float>(c.len()), 4, 0.3f, c.out<float>(c.len() * 2), c.index() % 2 ? 8 : 4, c.len());
    });
}

ZT_ALL_VARIANTS(QR);

}  // namespace
