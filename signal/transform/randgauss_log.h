// The natural logarithm of a positive normal double in plain double
// arithmetic: no fused multiply-add, no extended precision, no C runtime, so
// every build and processor (the x87 variants under DoublePrecisionScope)
// returns the same bits.  The error stays below 0.5 + 2^-8 units in the
// last place: the result is the nearest double except where the exact
// value lies within about 2^-8 units of a halfway point.
//
// x = 2^k z with z in [0.705, 1.41); z * invc = 1 + r for the table entry
// of z's top mantissa bits, where invc has 9 significant bits, so that r
// is exact as rh + rl (|r| < 2^-7); then
//   log x = k ln2 + log(1 / invc) + log1p(r),
// with the leading terms added as exact sums and the rest (the low parts,
// the series of log1p beyond r) added to their errors.
#pragma once

#include <cstdint>
#include <cstring>

namespace zor { inline namespace ZOR_INLINE_NS {

struct LogTableEntry {
    double invc;             // 9 significant bits, near 1 / z over the entry's range
    double logcHi, logcLo;   // -log(invc), as an unevaluated sum
};

// Entry i covers the doubles whose bits minus kLogOffset have i in bits
// 45..51; the entry holding 1 (in its middle) has invc = 1 exactly.
constexpr uint64_t kLogOffset = 0x3fe6900000000000ull;
constexpr LogTableEntry kLogTable[128] = {
    {0x1.6a00000000000p+0, -0x1.62c82f2b9c795p-2, -0x1.7b7af915300e5p-57},
    {0x1.6800000000000p+0, -0x1.5d1bdbf5809cap-2, -0x1.4236383dc7fe1p-56},
    {0x1.6600000000000p+0, -0x1.5767717455a6cp-2, -0x1.526adb283660cp-56},
    {0x1.6400000000000p+0, -0x1.51aad872df82dp-2, -0x1.3927ac19f55e3p-59},
    {0x1.6200000000000p+0, -0x1.4be5f957778a1p-2, 0x1.259b35b04813dp-57},
    {0x1.6000000000000p+0, -0x1.4618bc21c5ec2p-2, -0x1.f42decdeccf1dp-56},
    {0x1.5e00000000000p+0, -0x1.404308686a7e4p-2, 0x1.0bcfb6082ce6dp-56},
    {0x1.5d00000000000p+0, -0x1.3d54fa5c1f710p-2, 0x1.e3265c6a1c98dp-56},
    {0x1.5b00000000000p+0, -0x1.3772662bfd85bp-2, 0x1.b5629d8117de7p-59},
    {0x1.5900000000000p+0, -0x1.31871c9544185p-2, 0x1.51acc4c09b379p-60},
    {0x1.5700000000000p+0, -0x1.2b9303ab89d25p-2, 0x1.896b5fd852ad4p-56},
    {0x1.5500000000000p+0, -0x1.2596010df763ap-2, 0x1.0f76c57075e9ep-58},
    {0x1.5400000000000p+0, -0x1.22941fbcf7966p-2, 0x1.76f5eb09628afp-56},
    {0x1.5200000000000p+0, -0x1.1c898c16999fbp-2, 0x1.0e5c62aff1c44p-60},
    {0x1.5000000000000p+0, -0x1.1675cababa60ep-2, -0x1.ce63eab883717p-61},
    {0x1.4e00000000000p+0, -0x1.1058bf9ae4ad5p-2, -0x1.89fa0ab4cb31dp-58},
    {0x1.4d00000000000p+0, -0x1.0d46b579ab74bp-2, -0x1.03ec81c3cbd92p-57},
    {0x1.4b00000000000p+0, -0x1.071b85fcd590dp-2, -0x1.d1707f97bde80p-58},
    {0x1.4900000000000p+0, -0x1.00e6c45ad501dp-2, 0x1.cb9568ff6feadp-57},
    {0x1.4800000000000p+0, -0x1.fb9186d5e3e2bp-3, 0x1.caaae64f21acbp-57},
    {0x1.4600000000000p+0, -0x1.ef0adcbdc5936p-3, -0x1.48637950dc20dp-57},
    {0x1.4400000000000p+0, -0x1.e27076e2af2e6p-3, 0x1.61578001e0162p-59},
    {0x1.4300000000000p+0, -0x1.dc1bca0abec7dp-3, -0x1.834c51998b6fcp-57},
    {0x1.4100000000000p+0, -0x1.cf6354e09c5dcp-3, -0x1.239a07d55b695p-57},
    {0x1.4000000000000p+0, -0x1.c8ff7c79a9a22p-3, 0x1.4f689f8434012p-57},
    {0x1.3e00000000000p+0, -0x1.bc286742d8cd6p-3, -0x1.4fce744870f55p-58},
    {0x1.3d00000000000p+0, -0x1.b5b519e8fb5a4p-3, -0x1.ba27fdc19e1a0p-57},
    {0x1.3b00000000000p+0, -0x1.a8becfc882f19p-3, 0x1.e8c37918c39ebp-58},
    {0x1.3a00000000000p+0, -0x1.a23bc1fe2b563p-3, -0x1.93711b07a998cp-59},
    {0x1.3800000000000p+0, -0x1.9525a9cf456b4p-3, -0x1.d904c1d4e2e26p-57},
    {0x1.3700000000000p+0, -0x1.8e928de886d41p-3, 0x1.569d851a56770p-57},
    {0x1.3500000000000p+0, -0x1.815c0a14357ebp-3, 0x1.4be48073a0564p-58},
    {0x1.3400000000000p+0, -0x1.7ab890210d909p-3, -0x1.be36b2d6a0608p-59},
    {0x1.3200000000000p+0, -0x1.6d60fe719d21dp-3, 0x1.caae268ecd179p-57},
    {0x1.3100000000000p+0, -0x1.66acd4272ad51p-3, 0x1.0900e4e1ea8b2p-58},
    {0x1.2f00000000000p+0, -0x1.59338d9982086p-3, 0x1.65d22aa8ad7cfp-58},
    {0x1.2e00000000000p+0, -0x1.526e5e3a1b438p-3, 0x1.746ff8a470d3ap-57},
    {0x1.2d00000000000p+0, -0x1.4ba36f39a55e5p-3, -0x1.68981bcc36756p-57},
    {0x1.2b00000000000p+0, -0x1.3dfc2b0ecc62ap-3, 0x1.ab3a8e7d81017p-58},
    {0x1.2a00000000000p+0, -0x1.371fc201e8f74p-3, -0x1.de6cb62af18a0p-58},
    {0x1.2900000000000p+0, -0x1.303d718e47fd3p-3, 0x1.6b9c7d96091fap-63},
    {0x1.2700000000000p+0, -0x1.2266f190a5acbp-3, -0x1.f547bf1809e88p-57},
    {0x1.2600000000000p+0, -0x1.1b72ad52f67a0p-3, -0x1.483023472cd74p-58},
    {0x1.2500000000000p+0, -0x1.14785846742acp-3, -0x1.a28813e3a7f07p-57},
    {0x1.2300000000000p+0, -0x1.0671512ca596ep-3, -0x1.50c647eb86499p-58},
    {0x1.2200000000000p+0, -0x1.fec9131dbeabbp-4, 0x1.5746b9981b36cp-58},
    {0x1.2100000000000p+0, -0x1.f0a30c01162a6p-4, -0x1.85f325c5bbacdp-58},
    {0x1.1f00000000000p+0, -0x1.d4313d66cb35dp-4, -0x1.790dd951d90fap-58},
    {0x1.1e00000000000p+0, -0x1.c5e548f5bc743p-4, -0x1.5d617ef8161b1p-60},
    {0x1.1d00000000000p+0, -0x1.b78c82bb0eda1p-4, -0x1.0878cf0327e21p-61},
    {0x1.1c00000000000p+0, -0x1.a926d3a4ad563p-4, -0x1.942f48aa70ea9p-58},
    {0x1.1a00000000000p+0, -0x1.8c345d6319b21p-4, 0x1.4a697ab3424a9p-61},
    {0x1.1900000000000p+0, -0x1.7da766d7b12cdp-4, 0x1.eeedfcdd94131p-58},
    {0x1.1800000000000p+0, -0x1.6f0d28ae56b4cp-4, 0x1.906d99184b992p-58},
    {0x1.1700000000000p+0, -0x1.60658a93750c4p-4, 0x1.388458ec21b6ap-58},
    {0x1.1600000000000p+0, -0x1.51b073f06183fp-4, -0x1.a49e39a1a8be4p-58},
    {0x1.1500000000000p+0, -0x1.42edcbea646f0p-4, -0x1.ddd4f935996c9p-59},
    {0x1.1300000000000p+0, -0x1.253f62f0a1417p-4, 0x1.c125963fc4cfdp-62},
    {0x1.1200000000000p+0, -0x1.16536eea37ae1p-4, 0x1.79da3e8c22cdap-60},
    {0x1.1100000000000p+0, -0x1.075983598e471p-4, -0x1.80da5333c45b8p-59},
    {0x1.1000000000000p+0, -0x1.f0a30c01162a6p-5, -0x1.85f325c5bbacdp-59},
    {0x1.0f00000000000p+0, -0x1.d276b8adb0b52p-5, -0x1.1e3c53257fd47p-61},
    {0x1.0e00000000000p+0, -0x1.b42dd711971bfp-5, 0x1.eb9759c130499p-60},
    {0x1.0d00000000000p+0, -0x1.95c830ec8e3ebp-5, -0x1.f5a0e80520bf2p-59},
    {0x1.0b00000000000p+0, -0x1.58a5bafc8e4d5p-5, 0x1.ce55c2b4e2b72p-59},
    {0x1.0a00000000000p+0, -0x1.39e87b9febd60p-5, 0x1.5bfa937f551bbp-59},
    {0x1.0900000000000p+0, -0x1.1b0d98923d980p-5, 0x1.e9ae889bac481p-60},
    {0x1.0800000000000p+0, -0x1.f829b0e783300p-6, -0x1.33e3f04f1ef23p-60},
    {0x1.0700000000000p+0, -0x1.b9fc027af9198p-6, 0x1.0ae69229dc868p-64},
    {0x1.0600000000000p+0, -0x1.7b91b07d5b11bp-6, 0x1.5b602ace3a510p-60},
    {0x1.0500000000000p+0, -0x1.3cea44346a575p-6, 0x1.0cb5a902b3a1cp-62},
    {0x1.0400000000000p+0, -0x1.fc0a8b0fc03e4p-7, 0x1.83092c59642a1p-62},
    {0x1.0300000000000p+0, -0x1.7dc475f810a77p-7, 0x1.16d7687d3df21p-62},
    {0x1.0200000000000p+0, -0x1.fe02a6b106789p-8, 0x1.e44b7e3711ebfp-67},
    {0x1.0100000000000p+0, -0x1.ff00aa2b10bc0p-9, -0x1.2821ad5a6d353p-63},
    {0x1.0000000000000p+0, 0x0.0p+0, 0x0.0p+0},
    {0x1.fc00000000000p-1, 0x1.010157588de71p-7, 0x1.46662d417ced0p-62},
    {0x1.f800000000000p-1, 0x1.0205658935847p-6, 0x1.27c8e8416e71fp-60},
    {0x1.f400000000000p-1, 0x1.8492528c8cabfp-6, -0x1.d192d0619fa67p-60},
    {0x1.f000000000000p-1, 0x1.0415d89e74444p-5, 0x1.c05cf1d753622p-59},
    {0x1.ed00000000000p-1, 0x1.35c8bfaa1306bp-5, -0x1.50830a65543a4p-63},
    {0x1.e900000000000p-1, 0x1.788595a3577bap-5, 0x1.e5ef898b67923p-59},
    {0x1.e500000000000p-1, 0x1.bbcebfc68f420p-5, 0x1.e5cf3a0f56f72p-60},
    {0x1.e200000000000p-1, 0x1.eea31c006b87cp-5, -0x1.3e4fc93b7b66cp-59},
    {0x1.de00000000000p-1, 0x1.1973bd1465567p-4, -0x1.7558367a6acf6p-59},
    {0x1.db00000000000p-1, 0x1.333d7f8183f4bp-4, 0x1.a92afc8ef70b1p-58},
    {0x1.d700000000000p-1, 0x1.55e10050e0384p-4, -0x1.45f9d61c68c1bp-58},
    {0x1.d400000000000p-1, 0x1.700d30aeac0e1p-4, -0x1.72566212cdd05p-61},
    {0x1.d100000000000p-1, 0x1.8a6477a91dc29p-4, -0x1.fa83214904842p-59},
    {0x1.ce00000000000p-1, 0x1.a4e7640b1bc38p-4, -0x1.5b5ca203e4259p-58},
    {0x1.ca00000000000p-1, 0x1.c885801bc4b23p-4, 0x1.a38cb559a6706p-58},
    {0x1.c700000000000p-1, 0x1.e3707ee30487bp-4, 0x1.09ccecd579d99p-58},
    {0x1.c400000000000p-1, 0x1.fe89139dbd566p-4, -0x1.ac9f4215f9393p-58},
    {0x1.c100000000000p-1, 0x1.0ce7ecdccc28dp-3, -0x1.692a0055dc959p-57},
    {0x1.be00000000000p-1, 0x1.1aa2b7e23f72ap-3, -0x1.c6ef1d9b2ef7ep-59},
    {0x1.bb00000000000p-1, 0x1.28753bc11aba5p-3, -0x1.6394d9fa33311p-57},
    {0x1.b800000000000p-1, 0x1.365fcb0159016p-3, 0x1.7d411a5b944adp-58},
    {0x1.b500000000000p-1, 0x1.4462b9dc9b3dcp-3, -0x1.629c46c186385p-58},
    {0x1.b200000000000p-1, 0x1.527e5e4a1b58dp-3, -0x1.71a9682395bfdp-61},
    {0x1.af00000000000p-1, 0x1.60b3100b09476p-3, -0x1.5b2623e05016bp-58},
    {0x1.ac00000000000p-1, 0x1.6f0128b756abcp-3, -0x1.8de59c21e166cp-57},
    {0x1.aa00000000000p-1, 0x1.7898d85444c73p-3, 0x1.ef8f6ebcfb201p-58},
    {0x1.a700000000000p-1, 0x1.871213750e994p-3, 0x1.d685f35eea2a0p-57},
    {0x1.a400000000000p-1, 0x1.95a5adcf7017fp-3, 0x1.142c507fb7a3dp-58},
    {0x1.a100000000000p-1, 0x1.a454082e6ab05p-3, 0x1.df207dc5c34c6p-58},
    {0x1.9f00000000000p-1, 0x1.ae2ca6f672bd4p-3, 0x1.ab5ca9eaa088ap-57},
    {0x1.9c00000000000p-1, 0x1.bd087383bd8adp-3, 0x1.dd355f6a516d7p-60},
    {0x1.9a00000000000p-1, 0x1.c6ffbc6f00f71p-3, -0x1.8e58b2c57a4a5p-57},
    {0x1.9700000000000p-1, 0x1.d60a17f903515p-3, -0x1.c0df841a71b7ap-57},
    {0x1.9500000000000p-1, 0x1.e020cc6235ab5p-3, 0x1.fea48dd7b81d1p-58},
    {0x1.9200000000000p-1, 0x1.ef5ade4dcffe6p-3, -0x1.08ab2ddc708a0p-58},
    {0x1.9000000000000p-1, 0x1.f991c6cb3b379p-3, 0x1.f665066f980a2p-57},
    {0x1.8d00000000000p-1, 0x1.047e60cde83b8p-2, -0x1.0779634061cbcp-56},
    {0x1.8b00000000000p-1, 0x1.09aa572e6c6d4p-2, 0x1.43c2e68684d53p-57},
    {0x1.8800000000000p-1, 0x1.1178e8227e47cp-2, -0x1.0e63a5f01c691p-57},
    {0x1.8600000000000p-1, 0x1.16b5ccbacfb73p-2, 0x1.66fbd28b40935p-56},
    {0x1.8400000000000p-1, 0x1.1bf99635a6b95p-2, -0x1.12aeb84249223p-57},
    {0x1.8200000000000p-1, 0x1.214456d0eb8d4p-2, 0x1.f7ae91aeba60ap-57},
    {0x1.7f00000000000p-1, 0x1.2941afb186b7cp-2, -0x1.856e61c515740p-57},
    {0x1.7d00000000000p-1, 0x1.2e9e2bce12286p-2, 0x1.8251a3b83d97ap-62},
    {0x1.7b00000000000p-1, 0x1.3401e12aecba1p-2, -0x1.cd55b8a4746c0p-58},
    {0x1.7900000000000p-1, 0x1.396ce359bbf54p-2, -0x1.ce2b31b31e8b0p-58},
    {0x1.7600000000000p-1, 0x1.419b423d5e8c7p-2, 0x1.0dbb243827392p-57},
    {0x1.7400000000000p-1, 0x1.4718dc271c41bp-2, 0x1.8fb4c14c56eefp-60},
    {0x1.7200000000000p-1, 0x1.4c9e09e172c3cp-2, -0x1.123615b147a5dp-58},
    {0x1.7000000000000p-1, 0x1.522ae0738a3d8p-2, -0x1.8f7e9b38a6979p-57},
    {0x1.6e00000000000p-1, 0x1.57bf753c8d1fbp-2, -0x1.0908d15f88b63p-57},
    {0x1.6c00000000000p-1, 0x1.5d5bddf595f30p-2, -0x1.6541148cbb8a2p-56},
};

inline double logOfPositive(double x) {
    const auto bits = [](double v) { uint64_t u; std::memcpy(&u, &v, sizeof u); return u; };
    const auto value = [](uint64_t u) { double v; std::memcpy(&v, &u, sizeof v); return v; };
    // a + b as s + e exactly
    const auto twoSum = [](double a, double b, double& s, double& e) {
        s = a + b;
        const double bb = s - a;
        e = (a - (s - bb)) + (b - bb);
    };
    constexpr double kLn2Hi = 0x1.62e42fefa2000p-1;  // 40 bits: k * kLn2Hi is exact
    constexpr double kLn2Lo = 0x1.9ef35793c7673p-41;

    // All the bit work is on the high word (the offset's low word is 0),
    // which keeps it in 32-bit registers on 32-bit x86.
    const uint64_t ix = bits(x);
    const uint32_t high = uint32_t(ix >> 32), t = high - uint32_t(kLogOffset >> 32);
    const LogTableEntry& e = kLogTable[(t >> 13) & 127];
    const double k = double(int32_t(t) >> 20);
    const uint64_t iz = (uint64_t(high - (t & 0xfff00000u)) << 32) | uint32_t(ix);
    const double z = value(iz), zHi = value(iz & ~uint64_t(0x1ff));  // 44 bits: zHi * invc is exact
    const double rh = zHi * e.invc - 1.0;                              // exact: the product is near 1
    const double rl = (z - zHi) * e.invc;                              // exact: 9 bits times 9 bits

    double s1, e1, s2, e2;
    twoSum(k * kLn2Hi, e.logcHi, s1, e1);
    twoSum(s1, rh, s2, e2);
    // log1p(r) - r to r^9, from r rounded (the linear part stays exact)
    const double r = rh + rl, r2 = r * r;
    const double series =
        r2 * (-0.5 + r * (0x1.5555555555555p-2 +
                          r * (-0.25 + r * (0x1.999999999999ap-3 +
                                            r * (-0x1.5555555555555p-3 +
                                                 r * (0x1.2492492492492p-3 + r * (-0.125 + r * 0x1.c71c71c71c71cp-4)))))));
    const double low = ((e1 + e2) + (k * kLn2Lo + e.logcLo)) + (rl + series);
    return s2 + low;
}

}}  // namespace zor::ZOR_INLINE_NS
