// JPEG primitives on every variant: full-range colour and down-sampling
// against their integer formulas, MCU layouts, the transforms against
// double-precision DCTs, the table's reciprocals, checks and agreement.
#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class Jpeg : public zt::VariantTest {};

int64_t floorDiv(int64_t a, int64_t b) { return a >= 0 ? a / b : -((-a + b - 1) / b); }

TEST_P(Jpeg, FullRangeColourForEveryTriple) {
    std::vector<uint8_t> bgr(3 << 16), y(1 << 16), p[3] = {y, y, y};
    uint8_t* const planes[3] = {p[0].data(), p[1].data(), p[2].data()};
    for (int c = 0; c < 256; c += variant() == 1 ? 51 : 1) {  // the SSE column shares the generic entry
        for (int i = 0; i < 65536; ++i) bgr[3 * i] = uint8_t(i), bgr[3 * i + 1] = uint8_t(i >> 8), bgr[3 * i + 2] = uint8_t(c);
        ASSERT_EQ(z().zoriBGRToY_JPEG_8u_C3C1R(bgr.data(), 768, y.data(), 256, {256, 256}), StatusOk);
        ASSERT_EQ(z().zoriBGRToYCbCr_JPEG_8u_C3P3R(bgr.data(), 768, planes, 256, {256, 256}), StatusOk);
        for (int i = 0; i < 65536; ++i) {
            const int64_t b = bgr[3 * i], g = bgr[3 * i + 1], r = bgr[3 * i + 2], luma = floorDiv(19595 * r + 38470 * g + 7471 * b + 32768, 65536);
            ASSERT_TRUE(y[i] == luma && p[0][i] == luma && p[1][i] == floorDiv(-11059 * r - 21709 * g + 32768 * b + 8421375, 65536) &&
                        p[2][i] == floorDiv(32768 * r - 27439 * g - 5329 * b + 8421375, 65536)) << i;
        }
    }
}

TEST_P(Jpeg, SampleDownAndMcuLayouts) {
    std::mt19937 rng(2);
    std::vector<uint8_t> src(70 * 9), dst(35 * 4, 0), packed(8 * 40, 0);
    for (auto& v : src) v = uint8_t(rng());
    src[0] = src[1] = src[70] = 0, src[71] = 1;  // rounds up to 1
    // the destination ROI governs; the source ROI is only validated
    ASSERT_EQ(z().zoriSampleDownH2V2_JPEG_8u_C1R(src.data(), 70, {1, 1}, dst.data(), 35, {35, 4}), StatusOk);
    for (int i = 0; i < 35 * 4; ++i)
        ASSERT_EQ(dst[i], (src[i / 35 * 140 + i % 35 * 2] + src[i / 35 * 140 + i % 35 * 2 + 1] + src[i / 35 * 140 + i % 35 * 2 + 70] +
                           src[i / 35 * 140 + i % 35 * 2 + 71] + 3) / 4) << i;
    int16_t mcu[3][128], *const planes[3] = {mcu[0], mcu[1], mcu[2]};
    ASSERT_EQ(z().zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R(src.data(), 50, planes), StatusOk);
    for (int i = 0; i < 128; ++i) {  // row r = i / 16, pixel x = i % 16
        const uint8_t* p = &src[50 * (i / 16) + 3 * (i % 16)];
        ASSERT_EQ(mcu[0][i % 16 / 8 * 64 + i / 16 * 8 + i % 8], floorDiv(19595 * p[2] + 38470 * p[1] + 7471 * p[0], 65536) - 128);
        const int64_t bs = p[0] + p[3], gs = p[1] + p[4], rs = p[2] + p[5], j = i / 2;
        ASSERT_TRUE(i % 2 || (mcu[1][j] == floorDiv(-11059 * rs - 21709 * gs + 32768 * bs, 131072) &&
                              mcu[2][j] == floorDiv(32768 * rs - 27439 * gs - 5329 * bs, 131072))) << i;
    }
    mcu[0][127] = 32767, mcu[1][7] = -200;  // clamped to 255 and 0
    const int16_t* const in[3] = {mcu[0], mcu[1], mcu[2]};
    ASSERT_EQ(z().zoriJoin422LS_MCU_16s8u_P3C2R(in, packed.data(), 40), StatusOk);
    for (int i = 0; i < 64; ++i) {
        const int16_t* y = &mcu[0][i % 8 / 4 * 64 + i / 8 * 8 + 2 * (i % 4)];  // row i / 8, pair i % 8
        const int want[4] = {y[0], mcu[1][i], y[1], mcu[2][i]};
        for (int k = 0; k < 4; ++k) ASSERT_EQ(packed[40 * (i / 8) + 4 * (i % 8) + k], std::min(255, std::max(0, want[k] + 128)));
    }
}

// The T.81 DCT of a block, or its inverse, in double precision.
std::vector<double> dct(const std::vector<double>& in, bool inverse) {
    const auto c = [](int f, int s) { return (f ? 1.0 : std::sqrt(0.5)) * std::cos((2 * s + 1) * f * std::acos(-1.0) / 16) / 2; };
    std::vector<double> out(64, 0.0);
    for (int a = 0; a < 64; ++a)
        for (int b = 0; b < 64; ++b) out[a] += in[b] * (inverse ? c(b % 8, a % 8) * c(b / 8, a / 8) : c(a % 8, b % 8) * c(a / 8, b / 8));
    return out;
}

TEST_P(Jpeg, TransformsAgainstDoubleDct) {
    std::mt19937 rng(4);
    std::vector<uint16_t> ones(64, 32768), invOnes(64, 1), table(64), q(64);
    for (auto& t : table) t = uint16_t(rng() % 3 ? 1 + rng() % 65535 : 16384);  // any reciprocal; halves: ties
    std::vector<uint8_t> px(64), back(80, 7);
    std::vector<int16_t> coef(64), quant(64), generic(64);
    for (int trial = 0; trial < 300; ++trial) {
        const int base = int(rng() % 256);  // noise, extremes, smooth
        for (auto& v : px) v = uint8_t(trial % 3 == 0 ? rng() : trial % 3 == 1 ? rng() % 2 * 255 : std::min(255, base + int(rng() % 9)));
        ASSERT_EQ(z().zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(px.data(), 8, coef.data(), ones.data()), StatusOk);
        ASSERT_EQ(z().zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(px.data(), 8, quant.data(), table.data()), StatusOk);
        zt::api(0).zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(px.data(), 8, generic.data(), table.data());
        ASSERT_EQ(quant, generic);  // the SIMD transforms: bit for bit
        const std::vector<double> ref = dct(std::vector<double>(px.begin(), px.end()), false);
        for (int i = 0; i < 64; ++i) {
            ASSERT_LE(std::fabs(coef[i] - ref[i] + (i == 0 ? 1024 : 0)), 1.0) << i;   // level shift
            ASSERT_EQ(quant[i], std::nearbyint(double(table[i]) * coef[i] / 32768)) << i;  // ties to even
        }
        ASSERT_EQ(z().zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R(coef.data(), back.data(), 10, invOnes.data()), StatusOk);
        for (int i = 0; i < 64; ++i) ASSERT_LE(std::abs(back[i / 8 * 10 + i % 8] - px[i]), 1) << i;  // round trip
        std::vector<double> deq(64);  // other coefficients, dequantised: before the clamp
        for (int i = 0; i < 64; ++i) coef[i] = int16_t(int(rng() % 41) - 20), q[i] = uint16_t(1 + rng() % 40), deq[i] = coef[i] * q[i];
        ASSERT_EQ(z().zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R(coef.data(), back.data(), 10, q.data()), StatusOk);
        const std::vector<double> inv = dct(deq, true);
        for (int i = 0; i < 64; ++i) ASSERT_LE(std::fabs(back[i / 8 * 10 + i % 8] - std::min(255.0, std::max(0.0, inv[i] + 128))), 1.0);
        ASSERT_EQ(back[8], 7);
    }
    for (int flat : {128, 255}) {  // all zero, but for DC 127 * 8
        generic.assign(64, 0), generic[0] = int16_t((flat - 128) * 8);
        ASSERT_EQ(z().zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(std::vector<uint8_t>(64, uint8_t(flat)).data(), 8, coef.data(), ones.data()), StatusOk);
        EXPECT_EQ(coef, generic);
    }
}

TEST_P(Jpeg, QuantTableReciprocalsInNaturalOrder) {
    uint8_t raw[64], zzRow[16] = {0, 1, 5, 6, 14, 15, 27, 28, 35, 36, 48, 49, 57, 58, 62, 63};  // natural rows 0, 7
    uint16_t t[64];
    for (int q = 0; q < 256; q += 64) {  // raw entries q .. q + 63 in zigzag order
        for (int i = 0; i < 64; ++i) raw[i] = uint8_t(q + i);
        ASSERT_EQ(z().zoriQuantFwdTableInit_JPEG_8u16u(raw, t), q == 0 ? StatusWarnDivByZero : StatusOk);
        for (int j = 0; j < 16; ++j) {
            const uint64_t v = raw[zzRow[j]], r = v ? (uint64_t(1) << 31) / v : 0;
            ASSERT_EQ(t[j < 8 ? j : 48 + j], v ? (r + 32767 + 2 * ((r >> 16) & 1)) >> 16 : 65535) << q << " " << j;
        }
        EXPECT_TRUE(q || (t[0] == 65535 && t[1] == 32768));  // raw 0 and 1
    }
}

TEST_P(Jpeg, ChecksInOrder) {
    uint8_t src[48 * 8] = {}, dst[64] = {};
    zt::expectChecks(z().zoriBGRToY_JPEG_8u_C3C1R, {src, 12, dst, 4, ImageSize{4, 4}}, {zt::watch(dst, 64)}, zt::eachNull(),
                     zt::bad(StatusBadStep, zt::arg<3>(0), zt::arg<4>(ImageSize{0, 4})), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 0})));
    zt::expectChecks(z().zoriSampleDownH2V2_JPEG_8u_C1R, {src, 8, ImageSize{8, 8}, dst, 4, ImageSize{4, 4}}, {zt::watch(dst, 64)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0, 8}), zt::arg<3>(nullptr)),
                     zt::bad(StatusNullPointer, zt::arg<3>(nullptr), zt::arg<4>(0)),
                     zt::bad(StatusBadStep, zt::arg<4>(0), zt::arg<5>(ImageSize{0, 0})));
    int16_t mcu[3][128] = {}, *const out[3] = {mcu[0], mcu[1], mcu[2]}, *const noOut[3] = {mcu[0], mcu[1], nullptr};
    const uint16_t table[64] = {};
    zt::expectChecks(z().zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R, {src, 48, out}, {zt::watch(mcu, sizeof mcu)}, zt::eachNull(),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<2>(noOut)), zt::bad(StatusNullPointer, zt::arg<2>(noOut)));
    zt::expectChecks(z().zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R, {src, 8, mcu[0], table}, {zt::watch(mcu, sizeof mcu)},
                     zt::eachNull(), zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<3>(nullptr)));
    zt::expectChecks(z().zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R, {mcu[0], dst, 8, table}, {zt::watch(dst, 64)}, zt::eachNull(),
                     zt::bad(StatusBadStep, zt::arg<2>(-8), zt::arg<3>(nullptr)));
}

TEST_P(Jpeg, VariantsAgreeWithGeneric) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& a, zt::Case& c) {
        const ImageSize r = c.roi();
        const auto s = c.inImage<uint8_t>(3 * r.width, r.height), s2 = c.inImage<uint8_t>(2 * r.width, 2 * r.height);
        zt::ImageBuf<uint8_t> p[5];
        for (auto& b : p) b = c.outImage<uint8_t>(r.width, r.height);
        uint8_t* const planes[3] = {p[0].p, p[1].p, p[2].p};
        return a.zoriBGRToY_JPEG_8u_C3C1R(s.p, s.step, p[3].p, p[3].step, r) * 10000 +
               a.zoriBGRToYCbCr_JPEG_8u_C3P3R(s.p, s.step, planes, p[0].step, r) * 100 +
               a.zoriSampleDownH2V2_JPEG_8u_C1R(s2.p, s2.step, {2 * r.width, 2 * r.height}, p[4].p, p[4].step, r);
    });
}

ZT_ALL_VARIANTS(Jpeg);

}  // namespace
