// Entry points of the FFT engine for other families of the same variant.
#pragma once

namespace zor { namespace ZOR_NS {

// The magnitudes of the forward real transform of src, mag[0 .. N/2], as
// the CCS transform followed by the complex magnitude would give them, for
// real specs of orders 5 to 10 without scaling, where the arithmetic is
// SSE; false (nothing written) otherwise.
bool realTransformMagnitudes(const void* pSpec, const float* src, float* mag);

}}  // namespace zor::ZOR_NS
