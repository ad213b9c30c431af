// What parameter names cannot tell the call decoder: per family, the
// statuses its exports may return; per export and parameter, how large a
// buffer must be, which values are interesting, what a caller must not pass
// (the arguments the contract leaves unchecked); and the spec and state
// objects with the exports that make, use and free them.
//
// A family that lands later needs a row here only for what its names do not
// already say; the decoder lists the exports it cannot call and why.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "tests/fuzz/calls.h"

namespace zf {

// Read access to a call being built: the values chosen so far, by parameter name.
class CallView {
public:
    virtual ~CallView() = default;
    virtual const std::string& exportName() const = 0;
    virtual bool has(const char* name) const = 0;
    virtual int64_t i(const char* name) const = 0;       // integer parameters (0 when absent)
    virtual double real(const char* name) const = 0;
    virtual ImageSize size(const char* name) const = 0;
    virtual ImagePoint point(const char* name) const = 0;
    virtual ImageRect rect(const char* name) const = 0;
    virtual int64_t value(const char* name, int index) const = 0;  // entry of a small input array
    // The call that made the object passed as `name`, when it is of the kind
    // the export expects (null for a null, foreign or wrong-kind object).
    virtual const CallView* object(const char* name) const = 0;
    virtual const void* objectMemory(const char* name) const = 0;
    // Calls a size companion (GetSize, GetBufferSize) of the same variant with
    // this call's arguments of the same names; -1 when it fails.
    virtual int64_t companion(const char* exportName) const = 0;
};

// Elements (i, j), i in [row0, row1), j in [col0, col1), each elemBytes long,
// at pointer + i * rowStep + j * colStep.  A vector is one row; an image a
// row per image row (its border rows and columns included).
struct Shape {
    int64_t row0 = 0, row1 = 1, col0 = 0, col1 = 0;
    int64_t rowStep = 0, colStep = 0, elemBytes = 1;
    bool spansStep = false;  // every row is read or written up to its step

    static Shape vector(int64_t n, int64_t elemBytes) {
        Shape s;
        s.col1 = n;
        s.colStep = s.elemBytes = elemBytes;
        return s;
    }
};

struct Border {
    int64_t left = 0, right = 0, top = 0, bottom = 0;
};

using ShapeFn = std::function<Shape(const CallView&, int plane)>;
using CountFn = std::function<int64_t(const CallView&, int plane)>;

struct ParamRule {
    ParamRule(const char* e, const char* p) : exports(e), params(p) {}
    const char* exports;  // '|'-separated patterns, '*' matching any run of characters
    const char* params;   // ','-separated parameter names
    Role role = Role::Unknown;      // Unknown: what the names say
    std::vector<double> hints;      // interesting values, typical valid ones first
    CountFn count;                  // elements a pointer (or each plane pointer) must reach
    ShapeFn shape;                  // or its whole shape
    std::function<Border(const CallView&)> border;      // an image read around its ROI
    std::function<ImageSize(const CallView&)> extent;   // an image's size when no parameter gives it
    CountFn planes;                 // how many pointers a plane array holds
    bool nonNull = false;           // the contract does not check it: never passed null
    bool spansStep = false;         // the export touches whole rows up to the step
    int64_t atLeast = INT64_MIN;    // values outside [atLeast, atMost] are outside the contract
    int64_t atMost = INT64_MAX;
};

struct FamilyRule {
    FamilyRule(const char* h, std::vector<Status> s, std::vector<Status> partial = {}, bool differs = false,
               const char* freer = nullptr, const char* freed = nullptr)
        : home(h), statuses(std::move(s)), partialWrites(std::move(partial)), fallbackDiffers(differs),
          resultFreer(freer), freedResults(freed) {}
    const char* home;
    std::vector<Status> statuses;       // besides the common ones
    std::vector<Status> partialWrites;  // errors after which outputs may have changed
    // When an allocation fails, the family may fall back to another path
    // and succeed (its results may differ in rounding: the same status,
    // other bits).
    bool fallbackDiffers = false;
    const char* resultFreer = nullptr;  // frees the pointers that these exports return:
    const char* freedResults = nullptr;
};

struct ObjectKind {
    const char* name;
    const char* creator;  // the InitAlloc export
    const char* freer;
    const char* users;    // patterns of the exports that take it
    bool identified;      // carries an identifier word that every use checks
};

extern const std::vector<Status> kCommonStatuses;
extern const std::vector<Status> kEveryStatus;  // every code in zor.h

const std::vector<FamilyRule>& familyRules();
const std::vector<ParamRule>& paramRules();
const std::vector<ObjectKind>& objectKinds();
// Interesting values of parameters by name, wherever they appear.
const std::map<std::string, std::vector<double>>& nameHints();

bool matchesPattern(const std::string& name, const char* patterns);

}  // namespace zf
