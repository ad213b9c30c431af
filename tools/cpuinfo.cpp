// What the demo prints about the processor: the frame's own classification,
// compiled into the demo (the library exports no such query).
#include "frame/cpu.h"
#include "frame/dispatch.h"

extern "C" int zorDemoProcessorType(void) { return zor::cpu::processorType(); }
extern "C" int zorDemoSelectedVariant(void) {
    return zor::dispatch::selectVariant(zor::dispatch::liveSelector());
}
