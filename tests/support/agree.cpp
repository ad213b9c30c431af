#include "tests/support/agree.h"

#include <cmath>
#include <limits>

namespace zt {

namespace {
const int kLengths[] = {1, 3, 4, 7, 8, 9, 15, 16, 17, 31, 33, 63, 64, 65, 100, 257, 1031};
const ImageSize kSizes[] = {{1, 1},  {2, 3},  {3, 1},  {7, 5},  {8, 2},  {15, 4},  {16, 3},
                            {17, 5}, {31, 2}, {33, 7}, {47, 3}, {64, 4}, {65, 6}, {131, 5}};
constexpr int kLengthCount = sizeof kLengths / sizeof kLengths[0];
constexpr int kSizeCount = sizeof kSizes / sizeof kSizes[0];
}  // namespace

int caseCount() { return kLengthCount > kSizeCount ? kLengthCount : kSizeCount; }

Case makeCase(int index) {
    return Case(index, kLengths[index % kLengthCount], kSizes[index % kSizeCount], index % 4);
}

std::vector<uint8_t> Case::outputs() const {
    std::vector<uint8_t> all;
    for (size_t k : outputs_) all.insert(all.end(), buffers_[k]->data(), buffers_[k]->data() + buffers_[k]->size());
    return all;
}

std::vector<float> randomFloats(size_t n, uint32_t seed, float scale, bool specials) {
    std::mt19937 rng(seed);
    std::uniform_real_distribution<float> d(-scale, scale);
    const float inf = std::numeric_limits<float>::infinity();
    const float odd[] = {std::numeric_limits<float>::quiet_NaN(), inf, -inf, 0.0f, -0.0f,
                         std::numeric_limits<float>::denorm_min(), -1e-40f};
    std::vector<float> v(n);
    for (auto& x : v) x = specials && rng() % 16 == 0 ? odd[rng() % 7] : d(rng);
    return v;
}

}  // namespace zt
