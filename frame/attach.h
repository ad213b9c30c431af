// What the library does once, when the process maps it: bind the exports,
// build the product table, look for the marker file.  Everything written
// here is written under the loader's serialisation and only read later.
#pragma once

#include <cstdint>

#include "frame/dispatch.h"

namespace zor { namespace frame {

// entry [j * 256 + i] = i * j: pixel-by-weight products in 1/256 units.
extern uint16_t productTable[256 * 256];
// Set when a marker file ("<module path up to its last '.'>xml") exists at load.
extern int32_t altSuperSampling;
// The variant whose entries the slots hold (-1 before binding).
extern int boundVariant;
// The register width in bits of the entries bound: 128, or on x86-64 256 or
// 512 where wide entries were overlaid (0 before binding).
extern int boundWidth;

bool buildProductTable();

// Returns 0 when probed (found or not) and 0x80004005 when the path has no
// usable '.'; sets altSuperSampling either way.
uint32_t probeMarkerFile(const char* modulePath);

// Shows the load-failure message in the platform's way.
void reportLoadFailure(const char* text, const char* caption);

// The process-attach sequence; returns 1 to let the load proceed.
int processAttach(const char* modulePath,
                  dispatch::FailureReport report = reportLoadFailure);

}}  // namespace zor::frame
