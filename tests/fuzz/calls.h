// A call decoder for every export of the manifest.
//
// From a stream of choices (a fuzzer's input bytes, or a seeded generator)
// it builds one call of one export at a time: it reads the export's
// parameters from the manifest row (types and names), decides per parameter
// what kind of argument it is (a length, a step, a flag, an image, a vector,
// an output, a spec object ...), draws a value for every scalar, and then
// lays out guarded buffers exactly as large as the scalars it chose make the
// contract demand, so that every call it makes is one the contract allows,
// hostile values included.  Where names cannot tell how large a buffer must
// be or how a value may be drawn, a small per-family table does
// (contract.cpp), together with the statuses each family may return.
//
// After the call the oracle checks: the status is one the export may
// return; a failing call wrote nothing; inputs were never written; a made
// object is released by its free function; with the allocator hook in place
// (white-box builds), no block is left behind.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "zor.h"

namespace zf {

// ---- where the choices come from -----------------------------------------------------

class Source {
public:
    // The fuzzer's bytes; past their end every choice reads as 0.
    Source(const uint8_t* data, size_t size) : data_(data), size_(size) {}
    // A generator.  tame > 0 makes that many sixteenths of the selectors
    // pick their first option (typical, valid values): calls then mostly
    // get past the argument checks.
    explicit Source(uint64_t seed, int tame = 0) : state_(seed ? seed : 1), tame_(tame), random_(true) {}

    uint8_t byte();      // payload
    uint8_t select();    // which option of a choice
    uint16_t u16();
    uint32_t u32();
    bool exhausted() const { return !random_ && pos_ >= size_; }

private:
    uint64_t next();
    const uint8_t* data_ = nullptr;
    size_t size_ = 0, pos_ = 0;
    uint64_t state_ = 0;
    int tame_ = 0;
    bool random_ = false;
};

// The bytes that a decoder reads back as given values (seed corpora).
struct Encoder {
    std::vector<uint8_t> bytes;
    void byte(uint8_t b) { bytes.push_back(b); }
    void u16(uint16_t v) { byte(uint8_t(v)), byte(uint8_t(v >> 8)); }
    void u32(uint32_t v) { u16(uint16_t(v)), u16(uint16_t(v >> 16)); }
};

// ---- the exports, as the manifest gives them ---------------------------------------------

enum class Kind : uint8_t {
    Void, I8, U8, I16, U16, I32, U32, I64, F32, F64,
    Size, Point, Rect, C16s, C32s, C32f, C64s, C64f, Record,
    Ptr,     // pointer to one or more of `pointee`
    PtrPtr,  // pointer to pointers to `pointee`
};

struct Type {
    Kind kind = Kind::Void;
    Kind pointee = Kind::Void;  // Ptr: what it points to; PtrPtr: what the inner pointers point to
    uint16_t pointeeBytes = 0;
    bool pointeeConst = false;
};

// What a parameter is, decided once per export from its type and name.
enum class Role : uint8_t {
    Count,       // a length, width, height, order ...: drawn from sizes
    Step,        // an image row step in bytes
    Stride,      // a matrix stride in bytes
    Code,        // an integer flag, mode, mask code, scale factor, value ...
    Real,        // a floating-point or complex value
    Extent,      // an ImageSize
    Point,       // an ImagePoint
    Rect,        // an ImageRect
    Data,        // a buffer the call reads or writes (image, vector, matrix, table)
    Result,      // an output of one value (or a small array of them)
    Values,      // a small input array of scalars: const int dstOrder[3] ...
    Planes,      // an array of plane pointers: T* const pDst[3], int16_t** pDst
    Object,      // a spec or state object made by an InitAlloc export
    ObjectOut,   // where an InitAlloc export stores its object
    Block,       // memory from the library's allocators (zorsFree)
    Unknown,     // nothing tells how to make it: the export is not called
};

struct Param {
    std::string name;
    int extent = 0;  // N of a `name[N]` declarator
    Type type;
    Role role = Role::Unknown;
    int rule = -1;        // its row in paramRules(), if any
    int objectKind = -1;  // Object, ObjectOut: its row in objectKinds()
    int partner = -1;     // Data: its step or first stride; Step: the first image it steps
    int sizeFrom = -1;    // Data images: the ImageSize that gives the ROI
    int lengthFrom = -1;  // Data vectors: the length parameter
    int channels = 1;     // Data images: elements per pixel
};

enum class Result { Status, Pointer, Nothing };

// One argument word (or record) as the callee receives it.
struct Slot {
    alignas(16) unsigned char raw[16];
};

using Entry = void (*)();
using Invoker = int64_t (*)(Entry fn, const Slot* args);

struct Export {
    int index = 0;
    std::string name;
    std::string family;  // the manifest section it is listed under ("image/pixel/copy")
    Result result = Result::Status;
    std::vector<Param> params;
    Invoker invoke = nullptr;
    std::string skipReason;  // non-empty: the decoder cannot make its arguments
};

// Every manifest row, in manifest order, with its parameters classified.
const std::vector<Export>& exports();
const Export* findExport(const std::string& name);

// How the calls reach the library: one entry per manifest row.
using Entries = std::vector<Entry>;
Entries exportedEntries();  // the library's exports (zor.dll, libzor.so)

// ---- the allocator hook (white-box builds) ---------------------------------------------------

// Counts the blocks the library takes from the runtime's allocator and can
// fail the k-th one.  Installed by the white-box programs into the
// library's rawAlloc/rawFree (frame/memory.h); the black-box driver has none.
struct AllocationCounter {
    virtual ~AllocationCounter() = default;
    virtual int64_t live() const = 0;          // blocks taken and not yet returned
    virtual int64_t taken() const = 0;         // blocks taken so far
    virtual void failAt(int64_t k) = 0;        // fail the k-th block from now (0: none)
    virtual bool failed() const = 0;           // the planned failure happened
};

// ---- making calls ---------------------------------------------------------------------------------

struct Options {
    // Per-buffer limit: a pointer whose contract would need more memory is
    // passed as null instead (the call must then fail its null check).
    size_t bufferLimit = size_t(8) << 20;
    int maxCallsPerInput = 24;
    // Objects of these kinds are not made per call but taken from here
    // (shared read-only FFT specs in the thread test), keyed by kind name,
    // then by the value of the creator's order argument.
    std::map<std::string, std::map<int, void*>> shared;
    AllocationCounter* allocations = nullptr;
    // With an AllocationCounter: fail the k-th block that the export
    // itself takes (objects it is given are made before counting starts).
    int64_t failAllocation = 0;
    bool reportSlow = false;  // note calls that take over a second
    bool trace = false;       // print every call before it is made
};

// The record of one call: what was chosen and what came back.
struct Outcome {
    bool made = false;       // false: the export could not be called (skipped)
    int64_t result = 0;      // the status (or pointer bits)
    uint64_t outputHash = 0; // of every output buffer after the call
    int64_t allocations = 0; // blocks the call took (with an AllocationCounter)
    std::string failure;     // why the oracle rejected the call (empty: it passed)
    std::string description; // the export and its arguments
};

class Caller {
public:
    // entries[k]: the entries of code variant k (missing variants empty).
    Caller(std::vector<Entries> variants, Options options);
    ~Caller();

    // Decodes the call header (export, variant) and the call from src.
    Outcome next(Source& src);
    // Decodes and makes one call of the given export.
    Outcome call(Source& src, int exportIndex, int variant);
    // Every call an input makes (until the input ends or a call fails).
    // Returns the first failing outcome, or an empty one.
    Outcome run(Source& src, uint64_t* calls = nullptr);

    const Options& options() const { return options_; }
    int variantCount() const { return int(variants_.size()); }
    bool hasVariant(int k) const;

private:
    std::vector<Entries> variants_;
    Options options_;
};

// The bytes of a call whose scalars are given as recorded text
// ("roiSize=7x5 srcStep=40 pSrc=p ..."): the seed corpus is made from the
// argument sets that the unit tests use.  False when the line names no
// export or does not fit its parameters.
bool encodeCall(const std::string& line, Encoder& out);

// One line of text describing a status code.
std::string statusName(int64_t status);

}  // namespace zf
