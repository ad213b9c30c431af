// What `zor info` prints about the processor beside the library's version
// records: the frame's own classification, compiled into the tool (the
// library exports no such query).
#include "frame/cpu.h"

extern "C" int zorToolProcessorType(void) { return zor::cpu::processorType(); }
