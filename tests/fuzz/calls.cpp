#include "tests/fuzz/calls.h"

#include <algorithm>
#include <chrono>
#include <cinttypes>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <limits>
#include <sstream>
#include <type_traits>
#include <utility>

#include "tests/fuzz/contract.h"
#include "tests/support/guarded.h"

namespace zf {

// The manifest's text (generated from include/zor_manifest.h): the section
// comments name each export's family.
extern const char kManifestText[];

// ---- choices --------------------------------------------------------------------------------------

uint64_t Source::next() {
    // xorshift64*
    state_ ^= state_ >> 12;
    state_ ^= state_ << 25;
    state_ ^= state_ >> 27;
    return state_ * 0x2545F4914F6CDD1DULL;
}

uint8_t Source::byte() {
    if (random_) return uint8_t(next() >> 56);
    return pos_ < size_ ? data_[pos_++] : 0;
}

uint8_t Source::select() {
    if (random_ && tame_ > 0 && int(next() >> 60) < tame_) return 0;
    return byte();
}

uint16_t Source::u16() {
    const uint16_t lo = byte();
    return uint16_t(lo | (uint16_t(byte()) << 8));
}

uint32_t Source::u32() {
    if (random_) return uint32_t(next() >> 32);
    const uint32_t lo = u16();
    return lo | (uint32_t(u16()) << 16);
}

// ---- types from the manifest rows -------------------------------------------------------------------

namespace {

template <class T>
constexpr Kind kindOf() {
    using U = std::remove_cv_t<T>;
    if constexpr (std::is_void_v<U>) return Kind::Void;
    else if constexpr (std::is_pointer_v<U>) return Kind::Ptr;
    else if constexpr (std::is_same_v<U, int8_t>) return Kind::I8;
    else if constexpr (std::is_same_v<U, uint8_t>) return Kind::U8;
    else if constexpr (std::is_same_v<U, int16_t>) return Kind::I16;
    else if constexpr (std::is_same_v<U, uint16_t>) return Kind::U16;
    else if constexpr (std::is_same_v<U, int32_t> || std::is_same_v<U, int>) return Kind::I32;
    else if constexpr (std::is_same_v<U, uint32_t>) return Kind::U32;
    else if constexpr (std::is_same_v<U, int64_t>) return Kind::I64;
    else if constexpr (std::is_same_v<U, float>) return Kind::F32;
    else if constexpr (std::is_same_v<U, double>) return Kind::F64;
    else if constexpr (std::is_same_v<U, ImageSize>) return Kind::Size;
    else if constexpr (std::is_same_v<U, ImagePoint>) return Kind::Point;
    else if constexpr (std::is_same_v<U, ImageRect>) return Kind::Rect;
    else if constexpr (std::is_same_v<U, Complex16s>) return Kind::C16s;
    else if constexpr (std::is_same_v<U, Complex32s>) return Kind::C32s;
    else if constexpr (std::is_same_v<U, Complex32f>) return Kind::C32f;
    else if constexpr (std::is_same_v<U, Complex64s>) return Kind::C64s;
    else if constexpr (std::is_same_v<U, Complex64f>) return Kind::C64f;
    else return Kind::Record;
}

template <class T>
constexpr uint16_t bytesOf() {
    if constexpr (std::is_void_v<T>) return 0;
    else return uint16_t(sizeof(T));
}

template <class T>
Type typeOf() {
    Type t;
    if constexpr (std::is_pointer_v<T>) {
        using P = std::remove_pointer_t<T>;
        if constexpr (std::is_pointer_v<std::remove_cv_t<P>>) {
            using Q = std::remove_pointer_t<std::remove_cv_t<P>>;
            t.kind = Kind::PtrPtr;
            t.pointee = kindOf<Q>();
            t.pointeeBytes = bytesOf<std::remove_cv_t<Q>>();
            t.pointeeConst = std::is_const_v<Q>;
        } else {
            t.kind = Kind::Ptr;
            t.pointee = kindOf<P>();
            t.pointeeBytes = bytesOf<std::remove_cv_t<P>>();
            t.pointeeConst = std::is_const_v<P>;
        }
    } else {
        t.kind = kindOf<T>();
    }
    return t;
}

template <class A>
A fromSlot(const Slot& s) {
    A a;
    std::memcpy(&a, s.raw, sizeof(A));
    return a;
}

template <class F>
struct Invoke;
template <class R, class... A>
struct Invoke<R(A...)> {
    using Fn = R(ZOR_CALL*)(A...);
    static int64_t call(Entry fn, const Slot* s) {
        return with(reinterpret_cast<Fn>(fn), s, std::index_sequence_for<A...>{});
    }
    template <size_t... I>
    static int64_t with(Fn f, [[maybe_unused]] const Slot* s, std::index_sequence<I...>) {
        if constexpr (std::is_void_v<R>) {
            f(fromSlot<A>(s[I])...);
            return 0;
        } else if constexpr (std::is_pointer_v<R>) {
            return int64_t(reinterpret_cast<intptr_t>(f(fromSlot<A>(s[I])...)));
        } else {
            return int64_t(f(fromSlot<A>(s[I])...));
        }
    }
    static std::vector<Type> types() { return {typeOf<A>()...}; }
    static Result result() {
        if constexpr (std::is_void_v<R>) return Result::Nothing;
        else if constexpr (std::is_pointer_v<R>) return Result::Pointer;
        else return Result::Status;
    }
};

struct Row {
    const char* name;
    const char* params;
    Invoker invoke;
    std::vector<Type> (*types)();
    Result (*result)();
};

const Row kRows[] = {
#define ZOR_FN(map, ret, name, params) \
    {#name, #params, &Invoke<ret params>::call, &Invoke<ret params>::types, &Invoke<ret params>::result},
#include "zor_manifest.h"
#undef ZOR_FN
};
constexpr int kRowCount = int(sizeof kRows / sizeof kRows[0]);

// ---- names -----------------------------------------------------------------------------------------------

std::string trim(const std::string& s) {
    const size_t b = s.find_first_not_of(" \t\n\r");
    if (b == std::string::npos) return "";
    return s.substr(b, s.find_last_not_of(" \t\n\r") - b + 1);
}

bool startsWith(const std::string& s, const char* p) { return s.rfind(p, 0) == 0; }
bool endsWith(const std::string& s, const std::string& p) {
    return s.size() >= p.size() && s.compare(s.size() - p.size(), p.size(), p) == 0;
}

// "(const uint8_t* const pDst[3], int dstStep)" -> names and extents.
std::vector<std::pair<std::string, int>> parameterNames(const char* text) {
    std::string s = text;
    if (!s.empty() && s.front() == '(') s.erase(0, 1);
    if (!s.empty() && s.back() == ')') s.pop_back();
    std::vector<std::pair<std::string, int>> out;
    std::stringstream in(s);
    std::string piece;
    while (std::getline(in, piece, ',')) {
        piece = trim(piece);
        if (piece.empty() || piece == "void") continue;
        int extent = 0;
        const size_t bracket = piece.find('[');
        if (bracket != std::string::npos) {
            extent = std::atoi(piece.c_str() + bracket + 1);
            piece = trim(piece.substr(0, bracket));
        }
        size_t e = piece.size();
        size_t b = e;
        while (b > 0 && (std::isalnum(static_cast<unsigned char>(piece[b - 1])) || piece[b - 1] == '_')) --b;
        out.emplace_back(piece.substr(b, e - b), extent);
    }
    return out;
}

// Export name -> manifest section ("image/pixel/copy").
std::map<std::string, std::string> familiesFromManifest() {
    std::map<std::string, std::string> family;
    std::stringstream in(kManifestText);
    std::string line, section;
    std::string pending;  // a row split over lines
    while (std::getline(in, line)) {
        const size_t mark = line.find("/* ----");
        if (mark != std::string::npos) {
            const size_t b = mark + 7;
            const size_t e = line.find("----", b);
            section = trim(line.substr(b, e == std::string::npos ? std::string::npos : e - b));
            continue;
        }
        const size_t row = line.find("ZOR_FN(");
        if (row == std::string::npos) continue;
        std::stringstream cells(line.substr(row + 7));
        std::string cell;
        for (int k = 0; k < 3 && std::getline(cells, cell, ','); ++k)
            if (k == 2) family[trim(cell)] = section;
    }
    return family;
}

// The layout tokens of an image export: "C3AC4R" -> source C3, destination AC4.
struct Layouts {
    int src = 1, dst = 1;
    bool srcPlanar = false, dstPlanar = false;
};

int channelsOf(const std::string& t, bool& planar) {
    planar = t[0] == 'P';
    if (t == "AC4") return 4;
    return t.back() - '0';
}

Layouts layoutsOf(const std::string& name) {
    Layouts l;
    std::stringstream in(name);
    std::string seg;
    std::vector<std::string> segs;
    while (std::getline(in, seg, '_')) segs.push_back(seg);
    static const char* const tokens[] = {"AC4", "C1", "C2", "C3", "C4", "P3", "P4"};
    for (size_t k = 1; k < segs.size(); ++k) {
        std::string s = segs[k];
        std::vector<std::string> found;
        for (bool more = true; more && found.size() < 2;) {
            more = false;
            for (const char* t : tokens)
                if (startsWith(s, t)) {
                    found.push_back(t);
                    s.erase(0, std::strlen(t));
                    more = true;
                    break;
                }
        }
        if (found.empty()) continue;
        // what may follow: C (channel of interest), M (mask), I (in place), R, Sfs
        static const char* const tails[] = {"R", "IR", "MR", "CR", "RSfs", "IRSfs"};
        bool tail = false;
        for (const char* t : tails) tail = tail || s == t;
        if (!tail) continue;
        l.src = channelsOf(found[0], l.srcPlanar);
        if (found.size() > 1) l.dst = channelsOf(found[1], l.dstPlanar);
        else l.dst = l.src, l.dstPlanar = l.srcPlanar;
        return l;
    }
    return l;
}

// "pSrc" -> "src", "pSrcDst" -> "srcDst".
std::string baseOf(const std::string& name) {
    if (name.size() < 2 || name[0] != 'p' || !std::isupper(static_cast<unsigned char>(name[1]))) return name;
    std::string b = name.substr(1);
    b[0] = char(std::tolower(static_cast<unsigned char>(b[0])));
    return b;
}

bool isCountName(const std::string& n) {
    static const char* const names[] = {"len", "width", "height", "channels", "order", "winLen", "nFilter",
                                        "lenDCT", "lenCeps", "nLifter", "nLevels", "topBorderHeight",
                                        "leftBorderWidth", "lowerLag", "upperLag"};
    for (const char* c : names)
        if (n == c) return true;
    return startsWith(n, "len") || endsWith(n, "Len") || endsWith(n, "Width") || endsWith(n, "Height");
}

bool isScalar(Kind k) { return k != Kind::Ptr && k != Kind::PtrPtr && k != Kind::Void && k != Kind::Record; }
bool isRealKind(Kind k) {
    return k == Kind::F32 || k == Kind::F64 || k == Kind::C16s || k == Kind::C32s || k == Kind::C32f ||
           k == Kind::C64s || k == Kind::C64f;
}

int findParam(const Export& ex, const std::string& name) {
    for (size_t k = 0; k < ex.params.size(); ++k)
        if (ex.params[k].name == name) return int(k);
    return -1;
}

int ruleFor(const std::string& exportName, const std::string& param) {
    const auto& rules = paramRules();
    for (size_t r = 0; r < rules.size(); ++r) {
        if (!matchesPattern(exportName, rules[r].exports)) continue;
        std::stringstream in(rules[r].params);
        std::string p;
        while (std::getline(in, p, ','))
            if (matchesPattern(param, trim(p).c_str())) return int(r);
    }
    return -1;
}

int kindForUser(const std::string& exportName) {
    const auto& kinds = objectKinds();
    for (size_t k = 0; k < kinds.size(); ++k)
        if (exportName == kinds[k].freer || matchesPattern(exportName, kinds[k].users)) return int(k);
    return -1;
}

int kindForCreator(const std::string& exportName) {
    const auto& kinds = objectKinds();
    for (size_t k = 0; k < kinds.size(); ++k)
        if (exportName == kinds[k].creator) return int(k);
    return -1;
}

const FamilyRule* familyOf(const Export& ex) {
    for (const FamilyRule& f : familyRules())
        if (ex.family == f.home) return &f;
    return nullptr;
}

// The parameter that gives an image's step: "pSrc" -> "srcStep", "pDstEdges" -> "dstEdgeStep".
int stepPartner(const Export& ex, const std::string& base) {
    int k = findParam(ex, base + "Step");
    if (k < 0 && endsWith(base, "s")) k = findParam(ex, base.substr(0, base.size() - 1) + "Step");
    return k;
}

void classify(Export& ex) {
    const Layouts layouts = layoutsOf(ex.name);
    for (Param& p : ex.params) {
        p.rule = ruleFor(ex.name, p.name);
        const ParamRule* rule = p.rule >= 0 ? &paramRules()[p.rule] : nullptr;
        const Type& t = p.type;
        Role role = Role::Unknown;
        if (isScalar(t.kind)) {
            if (t.kind == Kind::Size) role = Role::Extent;
            else if (t.kind == Kind::Point) role = Role::Point;
            else if (t.kind == Kind::Rect) role = Role::Rect;
            else if (isRealKind(t.kind)) role = Role::Real;
            else if (endsWith(p.name, "Stride1") || endsWith(p.name, "Stride2")) role = Role::Stride;
            else if (endsWith(p.name, "Step")) role = Role::Step;
            else if (isCountName(p.name)) role = Role::Count;
            else role = Role::Code;
        } else if (t.kind == Kind::PtrPtr) {
            if (startsWith(p.name, "pp") && (t.pointee == Kind::Void || t.pointee == Kind::Record)) {
                role = Role::ObjectOut;
                p.objectKind = kindForCreator(ex.name);
            } else {
                role = Role::Planes;
            }
        } else if (t.kind == Kind::Ptr) {
            const int userKind = kindForUser(ex.name);
            if (t.pointee == Kind::Void) {
                if (p.name == "ptr") role = Role::Block;
                else role = Role::Object, p.objectKind = userKind;
            } else if (t.pointee == Kind::Record && userKind >= 0 && p.name != "pRegion") {
                role = Role::Object, p.objectKind = userKind;
            } else {
                const std::string base = baseOf(p.name);
                const bool dataName = startsWith(p.name, "pSrc") || startsWith(p.name, "pDst") ||
                                      startsWith(p.name, "pImage") || p.name == "pBuffer" ||
                                      p.name == "pMask" || p.name == "pKernel";
                if (p.extent > 0 && !dataName) role = t.pointeeConst ? Role::Values : Role::Result;
                else if (rule && (rule->count || rule->shape)) role = Role::Data;
                else if (stepPartner(ex, base) >= 0 || findParam(ex, base + "Stride1") >= 0 ||
                         findParam(ex, base + "Stride2") >= 0)
                    role = Role::Data;
                else if (findParam(ex, base + "Len") >= 0 || findParam(ex, "len" + std::string(1, char(std::toupper(
                                                                 static_cast<unsigned char>(base[0])))) + base.substr(1)) >= 0 ||
                         (dataName && findParam(ex, "len") >= 0))
                    role = Role::Data;
                else if (!dataName && !t.pointeeConst) role = Role::Result;
                else if (!dataName && t.pointeeConst && p.extent == 0) role = Role::Unknown;
            }
        }
        if (rule && rule->role != Role::Unknown) role = rule->role;
        p.role = role;
    }
    // partners: images and their steps, matrices and their strides, vectors and their lengths
    for (size_t k = 0; k < ex.params.size(); ++k) {
        Param& p = ex.params[k];
        if (p.role != Role::Data && p.role != Role::Planes) continue;
        const std::string base = baseOf(p.name);
        const int step = stepPartner(ex, base);
        const int stride = findParam(ex, base + "Stride1") >= 0 ? findParam(ex, base + "Stride1")
                                                                 : findParam(ex, base + "Stride2");
        if (step >= 0 && ex.params[step].role == Role::Step) {
            p.partner = step;
            if (ex.params[step].partner < 0) ex.params[step].partner = int(k);
            for (const std::string& c : {base + "RoiSize", base + "Size", std::string("roiSize"),
                                         std::string("dstRoiSize"), std::string("srcRoiSize")}) {
                const int s = findParam(ex, c);
                if (s >= 0 && ex.params[s].role == Role::Extent) {
                    p.sizeFrom = s;
                    break;
                }
            }
            const bool dst = startsWith(p.name, "pDst");
            p.channels = (p.name == "pMask") ? 1 : dst ? layouts.dst : layouts.src;
            if ((dst ? layouts.dstPlanar : layouts.srcPlanar) && p.role == Role::Planes) p.channels = 1;
        } else if (stride >= 0) {
            p.partner = stride;
            ex.params[stride].partner = int(k);
            const int s2 = findParam(ex, base + "Stride2");
            if (s2 >= 0) ex.params[s2].partner = int(k);
        } else {
            std::string cap = base;
            cap[0] = char(std::toupper(static_cast<unsigned char>(cap[0])));
            for (const std::string& c : {base + "Len", "len" + cap, std::string("len")}) {
                const int s = findParam(ex, c);
                if (s >= 0) {
                    p.lengthFrom = s;
                    break;
                }
            }
        }
    }
    // what the decoder cannot make
    for (const Param& p : ex.params) {
        const ParamRule* rule = p.rule >= 0 ? &paramRules()[p.rule] : nullptr;
        const bool ruled = rule && (rule->count || rule->shape);
        std::string why;
        if (p.role == Role::Unknown) why = "no rule for " + p.name;
        else if ((p.role == Role::Object || p.role == Role::ObjectOut) && p.objectKind < 0)
            why = "no object kind for " + p.name;
        else if (p.role == Role::Data && !ruled && p.partner < 0 && p.lengthFrom < 0)
            why = "no shape for " + p.name;
        else if (p.role == Role::Data && p.partner >= 0 && ex.params[p.partner].role == Role::Step &&
                 p.sizeFrom < 0 && !(rule && rule->extent) && !ruled)
            why = "no image size for " + p.name;
        else if (p.role == Role::Planes && p.extent == 0 && !(rule && rule->planes))
            why = "no plane count for " + p.name;
        else if (p.role == Role::Planes && p.partner < 0 && !ruled && p.lengthFrom < 0)
            why = "no plane shape for " + p.name;
        if (!why.empty() && ex.skipReason.empty()) ex.skipReason = why;
    }
}

std::vector<Export> makeExports() {
    const std::map<std::string, std::string> families = familiesFromManifest();
    std::vector<Export> all;
    for (int k = 0; k < kRowCount; ++k) {
        Export ex;
        ex.index = k;
        ex.name = kRows[k].name;
        const auto f = families.find(ex.name);
        ex.family = f == families.end() ? "" : f->second;
        ex.result = kRows[k].result();
        ex.invoke = kRows[k].invoke;
        const std::vector<Type> types = kRows[k].types();
        const auto names = parameterNames(kRows[k].params);
        for (size_t i = 0; i < types.size(); ++i) {
            Param p;
            p.type = types[i];
            if (i < names.size()) p.name = names[i].first, p.extent = names[i].second;
            ex.params.push_back(p);
        }
        classify(ex);
        all.push_back(std::move(ex));
    }
    return all;
}

}  // namespace

const std::vector<Export>& exports() {
    static const std::vector<Export> all = makeExports();
    return all;
}

const Export* findExport(const std::string& name) {
    for (const Export& e : exports())
        if (e.name == name) return &e;
    return nullptr;
}

std::string statusName(int64_t s) {
    static const std::map<int64_t, const char*> names = {
        {StatusOk, "Ok"}, {StatusBadArgument, "BadArgument"}, {StatusBadSize, "BadSize"},
        {StatusNullPointer, "NullPointer"}, {StatusNoMemory, "NoMemory"}, {StatusDivideByZero, "DivideByZero"},
        {StatusOutOfRange, "OutOfRange"}, {StatusBadScaleFactor, "BadScaleFactor"}, {StatusBadStep, "BadStep"},
        {StatusBadOrder, "BadOrder"}, {StatusBadFlag, "BadFlag"}, {StatusContextMismatch, "ContextMismatch"},
        {StatusBadFlip, "BadFlip"}, {StatusBadInterpolation, "BadInterpolation"},
        {StatusBadResizeFactor, "BadResizeFactor"}, {StatusBadFilterOrder, "BadFilterOrder"},
        {StatusBadMaskSize, "BadMaskSize"}, {StatusBadAnchor, "BadAnchor"}, {StatusStepBelowRow, "StepBelowRow"},
        {StatusBadChannelIndex, "BadChannelIndex"}, {StatusBadDivisor, "BadDivisor"},
        {StatusBadChannelOfInterest, "BadChannelOfInterest"}, {StatusBadChannelCount, "BadChannelCount"},
        {StatusZeroMask, "ZeroMask"}, {StatusChannelOrder, "ChannelOrder"}, {StatusBankNotReady, "BankNotReady"},
        {StatusBadMelMode, "BadMelMode"}, {StatusBadFrequencyRange, "BadFrequencyRange"},
        {StatusBadLevelCount, "BadLevelCount"}, {StatusNotEvenStep, "NotEvenStep"}, {StatusBadStride, "BadStride"},
        {StatusBadMatrixShape, "BadMatrixShape"}, {StatusWarnMisaligned, "WarnMisaligned"},
        {StatusWarnSqrtNegative, "WarnSqrtNegative"}, {StatusWarnDivByZero, "WarnDivByZero"},
        {StatusWarnLnZero, "WarnLnZero"}, {StatusWarnLnNegative, "WarnLnNegative"},
        {StatusWarnNoOperation, "WarnNoOperation"}, {StatusWarnOddSize, "WarnOddSize"}};
    const auto n = names.find(s);
    return std::to_string(s) + (n == names.end() ? std::string(" (no such code)") : " (" + std::string(n->second) + ")");
}

// ---- values -------------------------------------------------------------------------------------------------

namespace {

constexpr int kNull = 15;  // pointer selector (low four bits) that passes null

const std::vector<double>& hintsFor(const Param& p) {
    static const std::vector<double> none;
    if (p.rule >= 0 && !paramRules()[p.rule].hints.empty()) return paramRules()[p.rule].hints;
    const auto& byName = nameHints();
    const auto h = byName.find(p.name);
    return h == byName.end() ? none : h->second;
}

int64_t drawCount(uint8_t sel, uint32_t lit, const std::vector<double>& hints) {
    static const int64_t special[] = {0, -1, -2, -16, INT32_MIN, INT32_MAX, INT32_MIN + 1, 1 << 30,
                                      65533, 65534, 65535, 65536, 46341, 1 << 24, (1 << 28) + 1, 0x7FFFFFF0};
    switch (sel & 7) {
    case 3: return 1 + lit % 700;
    case 4: return special[lit % (sizeof special / sizeof special[0])];
    case 5: return int32_t(lit);
    case 6: return int32_t(uint32_t(uint64_t(1) << (lit & 31)) + uint32_t(int8_t(lit >> 8)));
    case 7:
        if (!hints.empty()) return int64_t(hints[(lit >> 3) % hints.size()]);
        return 1 + (lit & 15);
    default: return 1 + (lit & 15);
    }
}

int64_t truncateTo(Kind k, int64_t v) {
    switch (k) {
    case Kind::I8: return int8_t(v);
    case Kind::U8: return uint8_t(v);
    case Kind::I16: return int16_t(v);
    case Kind::U16: return uint16_t(v);
    case Kind::I32: return int32_t(v);
    case Kind::U32: return uint32_t(v);
    default: return v;
    }
}

const std::vector<double>& defaultCodes(Kind k) {
    static const std::vector<double> ints = {0, 1, 2, 3, 4, 5, 8, 16, 33, 55, 255, -1, 7, 31, 32, INT32_MIN, INT32_MAX};
    static const std::vector<double> bytes = {0, 1, 2, 127, 128, 254, 255};
    static const std::vector<double> shorts = {0, 1, -1, 2, 255, 32767, -32768, -32767, 16384};
    static const std::vector<double> words = {0, 1, 2, 15, 16, 17, 31, 32, 65535, 0xFFFFFFFF, 0x80000000};
    switch (k) {
    case Kind::I8: case Kind::U8: return bytes;
    case Kind::I16: case Kind::U16: return shorts;
    case Kind::U32: return words;
    default: return ints;
    }
}

int64_t drawCode(uint8_t sel, uint32_t lit, const std::vector<double>& hints, Kind k) {
    const std::vector<double>& h = hints.empty() ? defaultCodes(k) : hints;
    int64_t v;
    switch (sel & 3) {
    case 2: v = int64_t(lit % 40) - 8; break;
    case 3: v = k == Kind::I64 ? int64_t(int32_t(lit)) * 65537 : int64_t(int32_t(lit)); break;
    default: v = int64_t(h[(lit >> 2) % h.size()]); break;
    }
    return truncateTo(k, v);
}

double drawReal(uint8_t sel, uint32_t lit, const std::vector<double>& hints, bool isDouble) {
    static const double special[] = {0.0, -0.0, 1.0, -1.0, 0.5, 2.5, 255.5, 1e10, -1e10, 1e-30,
                                     std::numeric_limits<float>::quiet_NaN(), -std::numeric_limits<float>::quiet_NaN(),
                                     std::numeric_limits<float>::infinity(), -std::numeric_limits<float>::infinity(),
                                     std::numeric_limits<float>::min(), std::numeric_limits<float>::denorm_min(),
                                     std::numeric_limits<float>::max(), -std::numeric_limits<float>::max(),
                                     1e300, -1e300, 2147483648.0, -2147483649.0, 65535.5, 32767.5};
    switch (sel & 3) {
    case 0:
        if (!hints.empty()) return hints[(lit >> 2) % hints.size()];
        return int8_t(lit) / 4.0;
    case 1: return special[lit % (sizeof special / sizeof special[0])];
    case 2: return int16_t(lit) / 16.0;
    default: {
        float f;
        std::memcpy(&f, &lit, 4);
        return isDouble ? double(f) * (1.0 + (lit & 1) * 1e-9) : double(f);
    }
    }
}

template <class T>
void put(Slot& s, T v) {
    std::memset(s.raw, 0, sizeof s.raw);
    std::memcpy(s.raw, &v, sizeof v);
}

void putInteger(Slot& s, Kind k, int64_t v) {
    switch (k) {
    case Kind::I8: put(s, int8_t(v)); break;
    case Kind::U8: put(s, uint8_t(v)); break;
    case Kind::I16: put(s, int16_t(v)); break;
    case Kind::U16: put(s, uint16_t(v)); break;
    case Kind::U32: put(s, uint32_t(v)); break;
    case Kind::I64: put(s, int64_t(v)); break;
    default: put(s, int32_t(v)); break;
    }
}

size_t integerBytes(Kind k) {
    switch (k) {
    case Kind::I8: case Kind::U8: return 1;
    case Kind::I16: case Kind::U16: return 2;
    case Kind::I64: return 8;
    default: return 4;
    }
}

// Entries of a small input array: its element type, and how many of them
// one row holds (an array of arrays is a record of doubles: the
// coefficient matrices and quads of the geometry families).
Kind valueKind(const Type& t) { return t.pointee == Kind::Record ? Kind::F64 : t.pointee; }
int64_t valuesPerRow(const Type& t) {
    return t.pointee == Kind::Record && t.pointeeBytes >= 8 ? t.pointeeBytes / 8 : 1;
}

// ---- contents of buffers --------------------------------------------------------------------------------------

struct Rng {
    uint64_t s;
    uint64_t next() {
        s ^= s >> 12;
        s ^= s << 25;
        s ^= s >> 27;
        return s * 0x2545F4914F6CDD1DULL;
    }
};

bool isFloatData(Kind k) { return k == Kind::F32 || k == Kind::C32f; }
bool isDoubleData(Kind k) { return k == Kind::F64 || k == Kind::C64f; }

void fillBytes(uint8_t* p, size_t n, uint8_t mode, Kind k, Rng& rng) {
    if (n == 0) return;
    switch (mode) {
    case 3: {  // tame: small integers or quarter-steps
        if (isFloatData(k)) {
            for (size_t i = 0; i + 4 <= n; i += 4) {
                const float f = float(int(rng.next() % 33) - 16) / 4.0f;
                std::memcpy(p + i, &f, 4);
            }
        } else if (isDoubleData(k)) {
            for (size_t i = 0; i + 8 <= n; i += 8) {
                const double d = double(int(rng.next() % 33) - 16) / 4.0;
                std::memcpy(p + i, &d, 8);
            }
        } else {
            for (size_t i = 0; i < n; ++i) p[i] = uint8_t(rng.next() % 16);
        }
        return;
    }
    case 4: std::memset(p, int(rng.next() & 0xFF), n); return;
    case 5: std::memset(p, 0, n); return;
    case 6:
        if (isFloatData(k)) {  // ordinary floats with specials among them
            static const uint32_t specials[] = {0x7FC00000, 0xFFC00000, 0x7F800001, 0x7F800000, 0xFF800000,
                                                0x00000001, 0x80000000, 0x7F7FFFFF, 0x4F000000, 0xCF000000};
            for (size_t i = 0; i + 4 <= n; i += 4) {
                const uint64_t r = rng.next();
                uint32_t bits;
                if ((r & 7) == 0) bits = specials[(r >> 3) % 10];
                else {
                    const float f = float(int32_t(r >> 32) % 100000) / 64.0f;
                    std::memcpy(&bits, &f, 4);
                }
                std::memcpy(p + i, &bits, 4);
            }
            return;
        }
        [[fallthrough]];
    default:
        for (size_t i = 0; i < n; i += 8) {
            const uint64_t r = rng.next();
            std::memcpy(p + i, &r, std::min<size_t>(8, n - i));
        }
    }
}

uint64_t hashBytes(uint64_t h, const uint8_t* p, size_t n) {
    for (size_t i = 0; i < n; ++i) h = (h ^ p[i]) * 0x100000001B3ULL;
    return h;
}

// Byte offsets [lo, hi) that a shape reaches, or false when the contract
// would need more than `limit` bytes.
bool extentOf(const Shape& s, size_t limit, int64_t& lo, int64_t& hi) {
    lo = hi = 0;
    if (s.row1 <= s.row0 || s.col1 <= s.col0 || s.elemBytes <= 0) return true;
    // The bytes a call touches bound its time: rows that overlap (a step of
    // 0) would otherwise let a small buffer stand for a day's work.
    if (double(s.row1 - s.row0) * double(s.col1 - s.col0) * double(s.elemBytes) > double(limit)) return false;
    const double rows[2] = {double(s.row0), double(s.row1 - 1)};
    const double cols[2] = {double(s.col0), double(s.col1 - 1)};
    double dlo = 1e300, dhi = -1e300;
    for (double r : rows)
        for (double c : cols) {
            const double at = r * double(s.rowStep) + c * double(s.colStep);
            dlo = std::min(dlo, at);
            dhi = std::max(dhi, at + double(s.elemBytes));
            if (s.spansStep) dhi = std::max(dhi, r * double(s.rowStep) + double(s.rowStep));
        }
    if (dhi - dlo > double(limit) || std::fabs(dlo) > 1e15 || std::fabs(dhi) > 1e15) return false;
    lo = int64_t(dlo);
    hi = int64_t(dhi);
    return true;
}

}  // namespace

// ---- one call ----------------------------------------------------------------------------------------------------

namespace {

struct Buf {
    std::unique_ptr<zt::GuardedBuffer> mem;
    uint8_t* ptr = nullptr;  // what the callee gets
    bool input = false;
    std::vector<uint8_t> snapshot;
    std::string owner;
    uint8_t* data() const { return mem ? mem->data() : nullptr; }
    size_t size() const { return mem ? mem->size() : 0; }
};

class SharedObjectView;

struct CallState;

struct Arg {
    Slot slot{};
    int64_t v = 0;
    double real = 0, imag = 0;
    ImageSize size{};
    ImagePoint point{};
    ImageRect rect{};
    uint8_t sel = 0;  // deferred steps and strides
    uint32_t lit = 0;
    bool null = false, before = false;
    uint8_t fill = 0;
    bool overLimit = false;
    std::vector<int64_t> values;  // Values entries
    int buf = -1;                 // Data, Result, Values, ObjectOut: its buffer
    std::vector<int> planeBufs;   // Planes: one per plane (-1: null)
    int planeArray = -1;          // Planes: the array of pointers
    // objects
    std::unique_ptr<CallState> maker;
    std::unique_ptr<SharedObjectView> sharedView;
    void* object = nullptr;
    int kind = -1;
    bool expected = false, shared = false, consumed = false;
    int64_t blockBytes = 0;
};

class SharedObjectView : public CallView {
public:
    SharedObjectView(std::string creator, int order) : creator_(std::move(creator)), order_(order) {}
    const std::string& exportName() const override { return creator_; }
    bool has(const char* n) const override { return std::strcmp(n, "order") == 0; }
    int64_t i(const char* n) const override { return has(n) ? order_ : 0; }
    double real(const char*) const override { return 0; }
    ImageSize size(const char*) const override { return {0, 0}; }
    ImagePoint point(const char*) const override { return {0, 0}; }
    ImageRect rect(const char*) const override { return {0, 0, 0, 0}; }
    int64_t value(const char*, int) const override { return 0; }
    const CallView* object(const char*) const override { return nullptr; }
    const void* objectMemory(const char*) const override { return nullptr; }
    int64_t companion(const char*) const override { return -1; }

private:
    std::string creator_;
    int order_;
};

struct CallState final : CallView {
    CallState(const Export& e, int v, const std::vector<Entries>& all, const Options& o)
        : ex(e), variant(v), variants(all), opt(o), entries(all[v]) {}
    ~CallState() override { releaseObjects(); }

    const Export& ex;
    int variant;
    const std::vector<Entries>& variants;
    const Options& opt;
    const Entries& entries;
    std::vector<Arg> args;
    std::vector<Buf> bufs;
    Rng rng{1};
    std::string failure;
    std::vector<std::string> notes;
    int64_t result = 0;
    bool made = false;
    bool keepObject = false;   // a nested creator: its object goes to the caller
    void* madeObject = nullptr;
    int madeKind = -1;
    int64_t allocationsTaken = 0;
    int64_t blocksLeft = 0;  // blocks live after the call that were not before (a made object's)
    int64_t failAllocation = 0;

    // ---- CallView ----
    const std::string& exportName() const override { return ex.name; }
    int at(const char* name) const { return findParam(ex, name); }
    bool has(const char* name) const override { return at(name) >= 0; }
    int64_t i(const char* name) const override {
        const int k = at(name);
        return k < 0 ? 0 : args[k].v;
    }
    double real(const char* name) const override {
        const int k = at(name);
        return k < 0 ? 0 : args[k].real;
    }
    ImageSize size(const char* name) const override {
        const int k = at(name);
        return k < 0 ? ImageSize{0, 0} : args[k].size;
    }
    ImagePoint point(const char* name) const override {
        const int k = at(name);
        return k < 0 ? ImagePoint{0, 0} : args[k].point;
    }
    ImageRect rect(const char* name) const override {
        const int k = at(name);
        return k < 0 ? ImageRect{0, 0, 0, 0} : args[k].rect;
    }
    int64_t value(const char* name, int index) const override {
        const int k = at(name);
        if (k < 0 || index < 0 || size_t(index) >= args[k].values.size()) return 0;
        return args[k].values[index];
    }
    const CallView* object(const char* name) const override {
        const int k = at(name);
        if (k < 0 || !args[k].expected || !args[k].object) return nullptr;
        if (args[k].sharedView) return args[k].sharedView.get();
        return reinterpret_cast<const CallView*>(args[k].maker.get());
    }
    const void* objectMemory(const char* name) const override {
        const int k = at(name);
        return k < 0 || !args[k].expected ? nullptr : args[k].object;
    }
    int64_t companion(const char* name) const override;

    // ---- building ----
    void decode(Source& src);
    void decodeObject(Source& src, size_t k);
    void resolveSteps();
    void layOut();
    int addBuffer(const Shape& s, bool before, uint8_t fill, Kind kind, bool input, const std::string& owner,
                  bool& overLimit);
    Shape shapeOf(size_t k, int plane) const;
    void fillSlots();
    void fillSlot(size_t k);
    void execute();
    void oracle(int64_t before, const std::vector<uint8_t>& sentinel);
    void releaseObjects();
    bool freeObject(int kind, void* object, std::string& why);
    std::string describe() const;
    uint64_t outputHash() const;
};

int64_t CallState::companion(const char* name) const {
    const Export* c = findExport(name);
    if (!c) return -1;
    std::vector<Slot> slots(c->params.size());
    int32_t out = -1;
    for (size_t k = 0; k < c->params.size(); ++k) {
        const Param& p = c->params[k];
        if (p.role == Role::Result) {
            put(slots[k], static_cast<void*>(&out));
            continue;
        }
        const int mine = findParam(ex, p.name);
        if (mine < 0 && p.name == "channels" && layoutsOf(ex.name).src >= 1) {
            put(slots[k], int32_t(layoutsOf(ex.name).src));  // the size for this call's pixels
            continue;
        }
        if (mine < 0) return -1;
        const_cast<CallState*>(this)->fillSlot(size_t(mine));  // its value is final: scalars only
        slots[k] = args[mine].slot;
    }
    const int64_t st = c->invoke(entries[c->index], slots.data());
    return st == StatusOk ? int64_t(out) : -1;
}

void CallState::decode(Source& src) {
    args.resize(ex.params.size());
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        Arg& a = args[k];
        const std::vector<double>& hints = hintsFor(p);
        const ParamRule* rule = p.rule >= 0 ? &paramRules()[p.rule] : nullptr;
        auto pointerChoice = [&] {
            const uint8_t b = src.select();
            a.null = (b & 15) == kNull && !(rule && rule->nonNull);
            a.before = (b & 16) != 0;
            a.fill = uint8_t(b >> 5);
        };
        switch (p.role) {
        case Role::Count: {
            const uint8_t s = src.select();
            a.v = truncateTo(p.type.kind, drawCount(s, src.u32(), hints));
            break;
        }
        case Role::Step:
        case Role::Stride:
            a.sel = src.select();
            a.lit = src.u32();
            break;
        case Role::Code: {
            const uint8_t s = src.select();
            a.v = drawCode(s, src.u32(), hints, p.type.kind);
            break;
        }
        case Role::Real: {
            const bool integerParts = p.type.kind == Kind::C16s || p.type.kind == Kind::C32s || p.type.kind == Kind::C64s;
            const int parts = (p.type.kind == Kind::F32 || p.type.kind == Kind::F64) ? 1 : 2;
            for (int part = 0; part < parts; ++part) {
                const uint8_t s = src.select();
                const uint32_t lit = src.u32();
                const double v = integerParts ? double(drawCode(s, lit, {}, p.type.kind == Kind::C16s ? Kind::I16
                                                                     : p.type.kind == Kind::C32s ? Kind::I32
                                                                                                 : Kind::I64))
                                              : drawReal(s, lit, hints, p.type.kind == Kind::F64 || p.type.kind == Kind::C64f);
                (part ? a.imag : a.real) = v;
            }
            break;
        }
        case Role::Extent: {
            uint8_t s = src.select();
            a.size.width = int32_t(drawCount(s, src.u32(), hints));
            s = src.select();
            a.size.height = int32_t(drawCount(s, src.u32(), hints));
            break;
        }
        case Role::Point: {
            static const std::vector<double> small = {0, 1, 2, -1, 3, 4, -2, 5};
            const std::vector<double>& h = hints.empty() ? small : hints;
            uint8_t s = src.select();
            a.point.x = int32_t(drawCode(s, src.u32(), h, Kind::I32));
            s = src.select();
            a.point.y = int32_t(drawCode(s, src.u32(), h, Kind::I32));
            break;
        }
        case Role::Rect: {
            static const std::vector<double> small = {0, 1, 2, -1, 3};
            uint8_t s = src.select();
            a.rect.x = int32_t(drawCode(s, src.u32(), small, Kind::I32));
            s = src.select();
            a.rect.y = int32_t(drawCode(s, src.u32(), small, Kind::I32));
            s = src.select();
            a.rect.width = int32_t(drawCount(s, src.u32(), hints));
            s = src.select();
            a.rect.height = int32_t(drawCount(s, src.u32(), hints));
            break;
        }
        case Role::Data:
        case Role::Result:
        case Role::ObjectOut:
            pointerChoice();
            break;
        case Role::Values: {
            pointerChoice();
            // double coeffs[2][3]: two rows of three doubles
            const int n = (p.extent > 0 ? p.extent : 1) * int(valuesPerRow(p.type));
            for (int e = 0; e < n; ++e) {
                const uint8_t s = src.select();
                a.values.push_back(drawCode(s, src.u32(), hints, p.type.pointee));
            }
            break;
        }
        case Role::Planes: {
            pointerChoice();
            int64_t n = p.extent;
            if (rule && rule->planes) n = rule->planes(*this, -1);
            if (n > 4096) a.null = a.overLimit = true;  // an array of that many planes: over the limit
            n = std::max<int64_t>(0, std::min<int64_t>(n, 4096));
            for (int64_t e = 0; e < n; ++e) {
                const uint8_t b = e < 16 ? src.select() : 0;
                a.values.push_back(b);
            }
            break;
        }
        case Role::Object:
            decodeObject(src, k);
            break;
        case Role::Block: {
            const uint8_t b = src.select();
            a.null = (b & 3) == 3;
            a.blockBytes = 1 + (b >> 2);
            break;
        }
        case Role::Unknown: break;
        }
    }
    // values outside the contract's range are folded back into it (before
    // the steps, which follow the image sizes)
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        if (p.rule < 0) continue;
        const int64_t least = paramRules()[p.rule].atLeast, most = paramRules()[p.rule].atMost;
        auto fold = [&](int64_t& v) {
            if (v < least) v = least + (least - v) % 64;
            if (v > most) v = most - (v - most) % 64;
        };
        fold(args[k].v);
        if (p.role == Role::Extent) {
            int64_t w = args[k].size.width, h = args[k].size.height;
            fold(w), fold(h);
            args[k].size = {int32_t(w), int32_t(h)};
        }
        if (p.role == Role::Rect) {
            int64_t w = args[k].rect.width, h = args[k].rect.height;
            fold(w), fold(h);
            args[k].rect.width = int32_t(w), args[k].rect.height = int32_t(h);
        }
        if (p.role == Role::Values)
            for (int64_t& v : args[k].values) fold(v);
    }
    resolveSteps();
}

void CallState::decodeObject(Source& src, size_t k) {
    const Param& p = ex.params[k];
    Arg& a = args[k];
    const ObjectKind& want = objectKinds()[p.objectKind];
    const uint8_t b = src.select();
    const int choice = b & 7;
    a.kind = p.objectKind;
    if (choice == 5) {  // null
        a.null = true;
        return;
    }
    const auto sharedKind = opt.shared.find(want.name);
    if (sharedKind != opt.shared.end() && !sharedKind->second.empty() && ex.name != want.freer) {
        auto it = sharedKind->second.begin();
        std::advance(it, (b >> 3) % sharedKind->second.size());
        a.object = it->second;
        a.expected = a.shared = true;
        a.sharedView.reset(new SharedObjectView(want.creator, it->first));
        return;
    }
    int kind = p.objectKind;
    if (choice == 6 && want.identified) {
        // an object of another kind that carries an identifier, or a foreign block
        std::vector<int> others;
        for (size_t o = 0; o < objectKinds().size(); ++o)
            if (int(o) != p.objectKind && objectKinds()[o].identified) others.push_back(int(o));
        const size_t pick = (b >> 3) % (others.size() + 1);
        if (pick == others.size()) {
            Buf blob;
            blob.mem.reset(new zt::GuardedBuffer(64));
            blob.ptr = blob.mem->data();
            for (size_t i = 0; i < 64; ++i) blob.ptr[i] = uint8_t(rng.next());
            uint32_t id = uint32_t(rng.next()) | 0x80000000u;  // no identifier of the library is this large
            std::memcpy(blob.ptr, &id, 4);
            blob.owner = p.name + " (foreign block)";
            blob.input = true;
            bufs.push_back(std::move(blob));
            a.object = bufs.back().ptr;
            a.buf = int(bufs.size()) - 1;
            return;
        }
        kind = others[pick];
    }
    const Export* creator = findExport(objectKinds()[kind].creator);
    if (!creator || !creator->skipReason.empty()) {
        a.null = true;
        return;
    }
    std::unique_ptr<CallState> maker(new CallState(*creator, variant, variants, opt));
    maker->keepObject = true;
    maker->rng.s = rng.next() | 1;
    maker->decode(src);
    maker->layOut();
    maker->fillSlots();
    maker->execute();
    if (!maker->failure.empty()) {
        failure = "making " + p.name + ": " + maker->failure;
        notes.push_back(maker->describe());
    }
    a.object = maker->madeObject;
    a.kind = kind;
    a.expected = kind == p.objectKind && a.object;
    a.null = a.object == nullptr;
    a.maker = std::move(maker);
}

void CallState::resolveSteps() {
    // natural row bytes of the image a step belongs to
    auto natural = [&](size_t k) -> int64_t {
        const Param& s = ex.params[k];
        if (s.partner < 0) return 0;
        const Param& img = ex.params[s.partner];
        const int64_t elem = img.type.pointeeBytes ? img.type.pointeeBytes : 1;
        if (s.role == Role::Stride) {
            if (endsWith(s.name, "Stride2")) return elem;
            const int s2 = findParam(ex, baseOf(img.name) + "Stride2");
            const int64_t stride2 = s2 >= 0 ? args[s2].v : elem;
            const int64_t cols = has("width") ? i("width") : 3;
            return std::max<int64_t>(0, cols) * stride2;
        }
        int64_t width = 0;
        if (img.sizeFrom >= 0) width = args[img.sizeFrom].size.width;
        else if (img.rule >= 0 && paramRules()[img.rule].extent) width = paramRules()[img.rule].extent(*this).width;
        return std::max<int64_t>(0, width) * img.channels * elem;
    };
    auto resolve = [&](size_t k) {
        Arg& a = args[k];
        const Param& s = ex.params[k];
        const int64_t r = natural(k);
        const int64_t elem = s.partner >= 0 && ex.params[s.partner].type.pointeeBytes ? ex.params[s.partner].type.pointeeBytes : 1;
        int64_t v;
        switch (a.sel & 7) {
        case 0: v = r + (a.lit & 3) * elem; break;
        case 1: v = r + (a.lit & 63); break;
        case 2: v = r - 1 - (a.lit & 7); break;
        case 3: v = 0; break;
        case 4: v = -(r + (a.lit & 3) * elem); break;
        case 5: v = int32_t(a.lit); break;
        case 6: v = int8_t(a.lit); break;
        default: v = r; break;
        }
        // A C caller's typed rows start on element boundaries; a step that is
        // no multiple of the element survives only where the family reports
        // odd steps of 16-bit images, and only in one call of eight.
        const bool oddChecked = elem == 2 && (a.lit >> 29) == 7 && familyOf(ex) &&
                                std::count(familyOf(ex)->statuses.begin(), familyOf(ex)->statuses.end(),
                                           StatusNotEvenStep);
        if (!oddChecked && elem > 1) v -= ((v % elem) + elem) % elem;
        a.v = int32_t(v);
    };
    for (int pass = 0; pass < 2; ++pass)
        for (size_t k = 0; k < ex.params.size(); ++k) {
            const Param& s = ex.params[k];
            if (s.role == Role::Step && pass == 0) resolve(k);
            if (s.role == Role::Stride && (endsWith(s.name, "Stride2") ? pass == 0 : pass == 1)) resolve(k);
        }
}

Shape CallState::shapeOf(size_t k, int plane) const {
    const Param& p = ex.params[k];
    const ParamRule* rule = p.rule >= 0 ? &paramRules()[p.rule] : nullptr;
    const int64_t elem = p.type.pointeeBytes ? p.type.pointeeBytes : 1;
    if (rule && rule->shape) return rule->shape(*this, plane);
    if (rule && rule->count) return Shape::vector(rule->count(*this, plane), elem);
    if (p.role == Role::Result) return Shape::vector(std::max(1, p.extent), elem);
    if (p.partner >= 0 && ex.params[p.partner].role == Role::Step) {
        ImageSize roi = p.sizeFrom >= 0 ? args[p.sizeFrom].size : ImageSize{0, 0};
        if (rule && rule->extent) roi = rule->extent(*this);
        Shape s;
        if (roi.width < 1 || roi.height < 1) return Shape::vector(0, 1);
        const Border b = rule && rule->border ? rule->border(*this) : Border{};
        const int64_t pix = elem * p.channels;
        s.row0 = -std::max<int64_t>(0, b.top);
        s.row1 = roi.height + std::max<int64_t>(0, b.bottom);
        s.col0 = -std::max<int64_t>(0, b.left);
        s.col1 = roi.width + std::max<int64_t>(0, b.right);
        s.rowStep = args[p.partner].v;
        s.colStep = s.elemBytes = pix;
        s.spansStep = rule && rule->spansStep;
        return s;
    }
    if (p.partner >= 0 && ex.params[p.partner].role == Role::Stride) {
        const std::string base = baseOf(p.name);
        const int s1 = findParam(ex, base + "Stride1"), s2 = findParam(ex, base + "Stride2");
        Shape s;
        s.elemBytes = elem;
        s.colStep = s2 >= 0 ? args[s2].v : elem;
        if (s1 >= 0) {
            s.rowStep = args[s1].v;
            s.row1 = has("height") ? i("height") : 3;
            s.col1 = has("width") ? i("width") : 3;
        } else {
            s.col1 = has("len") ? i("len") : 0;
        }
        return s;
    }
    if (p.lengthFrom >= 0) return Shape::vector(args[p.lengthFrom].v, elem);
    return Shape::vector(0, 1);
}

int CallState::addBuffer(const Shape& s, bool before, uint8_t fill, Kind kind, bool input, const std::string& owner,
                         bool& overLimit) {
    int64_t lo, hi;
    if (!extentOf(s, opt.bufferLimit, lo, hi)) {
        overLimit = true;
        return -1;
    }
    Buf b;
    const size_t bytes = size_t(hi - lo);
    b.mem.reset(new zt::GuardedBuffer(bytes, before && bytes ? zt::Guard::Before : zt::Guard::After));
    b.ptr = b.mem->data() - lo;
    b.input = input;
    b.owner = owner;
    fillBytes(b.mem->data(), bytes, fill, kind, rng);
    bufs.push_back(std::move(b));
    return int(bufs.size()) - 1;
}

void CallState::layOut() {
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        Arg& a = args[k];
        switch (p.role) {
        case Role::Data:
        case Role::Result:
            if (a.null) break;
            a.buf = addBuffer(shapeOf(k, -1), a.before, a.fill, p.type.pointee, p.type.pointeeConst, p.name, a.overLimit);
            if (a.buf < 0) a.null = true;
            break;
        case Role::Values: {
            if (a.null) break;
            const Kind kind = valueKind(p.type);
            const size_t eb = kind == Kind::F32 ? 4 : kind == Kind::F64 ? 8 : integerBytes(kind);
            bool over = false;
            a.buf = addBuffer(Shape::vector(int64_t(a.values.size()), int64_t(eb)), false, 5, p.type.pointee, true,
                              p.name, over);
            for (size_t e = 0; e < a.values.size(); ++e) {
                const int64_t v = a.values[e];
                uint8_t* at = bufs[a.buf].ptr + e * eb;
                if (kind == Kind::F32) {
                    const float f = float(v);
                    std::memcpy(at, &f, 4);
                } else if (kind == Kind::F64) {
                    const double d = double(v);
                    std::memcpy(at, &d, 8);
                } else {
                    std::memcpy(at, &v, eb);  // little-endian: the low bytes
                }
            }
            break;
        }
        case Role::Planes: {
            if (a.null) break;
            const size_t n = a.values.size();
            bool over = false;
            a.planeArray = addBuffer(Shape::vector(int64_t(n), int64_t(sizeof(void*))), a.before, 5, Kind::Void,
                                     p.type.pointeeConst || p.extent > 0, p.name, over);
            if (a.planeArray < 0) {
                a.null = true;
                break;
            }
            for (size_t e = 0; e < n; ++e) {
                const uint8_t choice = uint8_t(a.values[e]);
                int b = -1;
                if ((choice & 15) != kNull) {
                    bool planeOver = false;
                    b = addBuffer(shapeOf(k, int(e)), (choice & 16) != 0, uint8_t(choice >> 5), p.type.pointee,
                                  p.type.pointeeConst, p.name + "[" + std::to_string(e) + "]", planeOver);
                    if (planeOver) a.overLimit = true;
                }
                a.planeBufs.push_back(b);
                void* ptr = b >= 0 ? static_cast<void*>(bufs[b].ptr) : nullptr;
                std::memcpy(bufs[a.planeArray].ptr + e * sizeof(void*), &ptr, sizeof ptr);
            }
            break;
        }
        case Role::ObjectOut: {
            if (a.null) break;
            bool over = false;
            a.buf = addBuffer(Shape::vector(1, sizeof(void*)), false, 5, Kind::Void, false, p.name, over);
            const uintptr_t sentinel = uintptr_t(0x5EA7C0DE5EA7C0DEULL);
            std::memcpy(bufs[a.buf].ptr, &sentinel, sizeof(void*));
            break;
        }
        case Role::Block:
            if (a.null) break;
            {
                const Export* m = findExport("zorsMalloc_8u");
                if (!m) {
                    a.null = true;
                    break;
                }
                Slot s;
                put(s, int32_t(a.blockBytes));
                a.object = reinterpret_cast<void*>(intptr_t(m->invoke(entries[m->index], &s)));
                a.null = a.object == nullptr;
            }
            break;
        default: break;
        }
    }
}

void CallState::fillSlots() {
    for (size_t k = 0; k < ex.params.size(); ++k) fillSlot(k);
}

void CallState::fillSlot(size_t k) {
    {
        const Param& p = ex.params[k];
        Arg& a = args[k];
        switch (p.role) {
        case Role::Count:
        case Role::Step:
        case Role::Stride:
        case Role::Code: putInteger(a.slot, p.type.kind, a.v); break;
        case Role::Real:
            switch (p.type.kind) {
            case Kind::F32: put(a.slot, float(a.real)); break;
            case Kind::F64: put(a.slot, a.real); break;
            case Kind::C16s: put(a.slot, Complex16s{int16_t(a.real), int16_t(a.imag)}); break;
            case Kind::C32s: put(a.slot, Complex32s{int32_t(a.real), int32_t(a.imag)}); break;
            case Kind::C32f: put(a.slot, Complex32f{float(a.real), float(a.imag)}); break;
            case Kind::C64s: put(a.slot, Complex64s{int64_t(a.real), int64_t(a.imag)}); break;
            case Kind::C64f: put(a.slot, Complex64f{a.real, a.imag}); break;
            default: break;
            }
            break;
        case Role::Extent: put(a.slot, a.size); break;
        case Role::Point: put(a.slot, a.point); break;
        case Role::Rect: put(a.slot, a.rect); break;
        case Role::Data:
        case Role::Result:
        case Role::Values:
        case Role::ObjectOut:
            put(a.slot, static_cast<void*>(a.null || a.buf < 0 ? nullptr : bufs[a.buf].ptr));
            break;
        case Role::Planes:
            put(a.slot, static_cast<void*>(a.null || a.planeArray < 0 ? nullptr : bufs[a.planeArray].ptr));
            break;
        case Role::Object:
        case Role::Block: put(a.slot, a.null ? nullptr : a.object); break;
        case Role::Unknown: put(a.slot, int64_t(0)); break;
        }
    }
}

bool CallState::freeObject(int kind, void* object, std::string& why) {
    const Export* freer = findExport(objectKinds()[kind].freer);
    if (!freer) {
        why = std::string("no free function ") + objectKinds()[kind].freer;
        return false;
    }
    Slot s;
    put(s, object);
    const int64_t st = freer->invoke(entries[freer->index], &s);
    if (st != StatusOk) {
        why = freer->name + " of its own object returned " + statusName(st);
        return false;
    }
    return true;
}

void CallState::releaseObjects() {
    for (Arg& a : args) {
        if (a.object && a.maker && !a.consumed && !a.shared) {
            std::string why;
            if (!freeObject(a.kind, a.object, why) && failure.empty()) failure = why;
        }
        a.object = nullptr;
        a.maker.reset();
    }
    if (madeObject && !keepObject) {
        std::string why;
        if (!freeObject(madeKind, madeObject, why) && failure.empty()) failure = why;
        madeObject = nullptr;
    }
}

std::string CallState::describe() const {
    std::ostringstream o;
    o << ex.name << "[v" << variant << "](";
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        const Arg& a = args[k];
        if (k) o << ", ";
        o << p.name << "=";
        switch (p.role) {
        case Role::Count:
        case Role::Step:
        case Role::Stride:
        case Role::Code: o << a.v; break;
        case Role::Real:
            o << a.real;
            if (p.type.kind != Kind::F32 && p.type.kind != Kind::F64) o << "+" << a.imag << "i";
            break;
        case Role::Extent: o << a.size.width << "x" << a.size.height; break;
        case Role::Point: o << "(" << a.point.x << "," << a.point.y << ")"; break;
        case Role::Rect: o << "{" << a.rect.x << "," << a.rect.y << "," << a.rect.width << "," << a.rect.height << "}"; break;
        case Role::Values:
            if (a.null) o << "null";
            else {
                o << "{";
                for (size_t e = 0; e < a.values.size(); ++e) o << (e ? "," : "") << a.values[e];
                o << "}";
            }
            break;
        case Role::Planes:
            if (a.null) o << (a.overLimit ? "null(over limit)" : "null");
            else {
                o << "[";
                for (size_t e = 0; e < a.planeBufs.size(); ++e)
                    o << (e ? "," : "") << (a.planeBufs[e] < 0 ? std::string("null") : std::to_string(bufs[a.planeBufs[e]].size()) + "B");
                o << "]";
            }
            break;
        case Role::Object:
            if (a.null || !a.object) o << "null";
            else if (a.shared) o << "shared " << objectKinds()[a.kind].name;
            else if (a.kind < 0 || !a.maker) o << "foreign block";
            else o << objectKinds()[a.kind].name << (a.expected ? "" : " (wrong kind)") << " from " << a.maker->describe();
            break;
        default:
            if (a.null) o << (a.overLimit ? "null(over limit)" : "null");
            else if (a.buf >= 0) o << bufs[a.buf].size() << "B" << (a.before ? "<" : ">");
            else o << "block";
            break;
        }
    }
    o << ")";
    return o.str();
}

uint64_t CallState::outputHash() const {
    uint64_t h = 0xCBF29CE484222325ULL;
    // a returned pointer differs from run to run: only whether there is one counts
    const int64_t shown = ex.result == Result::Pointer ? int64_t(result != 0) : result;
    h = hashBytes(h, reinterpret_cast<const uint8_t*>(&shown), sizeof shown);
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        const Arg& a = args[k];
        if (p.role == Role::ObjectOut || p.role == Role::Object) continue;  // addresses differ between runs
        auto add = [&](int b) {
            if (b >= 0 && !bufs[b].input) h = hashBytes(h, bufs[b].data(), bufs[b].size());
        };
        add(a.buf);
        for (int b : a.planeBufs) add(b);
    }
    return h;
}

void CallState::execute() {
    made = true;
    if (!failure.empty()) return;  // making an object failed the oracle already
    for (Buf& b : bufs) b.snapshot.assign(b.data(), b.data() + b.size());
    const int64_t liveBefore = opt.allocations ? opt.allocations->live() : 0;
    const int64_t takenBefore = opt.allocations ? opt.allocations->taken() : 0;
    if (opt.allocations && failAllocation > 0) opt.allocations->failAt(failAllocation);
    const Entry fn = entries[ex.index];
    if (opt.trace) std::fprintf(stderr, "call %s\n", describe().c_str());
    const auto t0 = std::chrono::steady_clock::now();
    result = ex.invoke(fn, [&] {
        static thread_local std::vector<Slot> slots;
        slots.resize(args.size() + 1);
        for (size_t k = 0; k < args.size(); ++k) slots[k] = args[k].slot;
        return slots.data();
    }());
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - t0).count();
    if (opt.allocations) {
        if (failAllocation > 0) opt.allocations->failAt(0);
        allocationsTaken = opt.allocations->taken() - takenBefore;
        blocksLeft = opt.allocations->live() - liveBefore;
    }
    if (opt.reportSlow && seconds > 1.0)
        std::fprintf(stderr, "slow call (%.1f s): %s -> %s\n", seconds, describe().c_str(), statusName(result).c_str());
    oracle(liveBefore, {});
}

void CallState::oracle(int64_t liveBefore, const std::vector<uint8_t>&) {
    auto fail = [&](const std::string& why) {
        if (failure.empty()) failure = why;
    };
    const FamilyRule* family = familyOf(ex);
    const bool error = ex.result == Result::Status && int32_t(result) < 0;
    if (ex.result == Result::Status) {
        const int32_t st = int32_t(result);
        bool allowed = std::find(kCommonStatuses.begin(), kCommonStatuses.end(), st) != kCommonStatuses.end();
        if (family) allowed = allowed || std::find(family->statuses.begin(), family->statuses.end(), st) != family->statuses.end();
        else allowed = allowed || std::find(kEveryStatus.begin(), kEveryStatus.end(), st) != kEveryStatus.end();
        if (!allowed) fail("returned " + statusName(st) + ", which " + ex.name + " may not return");
    }
    const bool partialAllowed =
        error && family &&
        std::find(family->partialWrites.begin(), family->partialWrites.end(), int32_t(result)) != family->partialWrites.end();
    for (const Buf& b : bufs) {
        if (b.size() == 0 || std::memcmp(b.data(), b.snapshot.data(), b.size()) == 0) continue;
        if (b.input) fail("wrote to its input " + b.owner);
        else if (error && !partialAllowed) fail("failed with " + statusName(result) + " but wrote to " + b.owner);
    }
    // objects: the one an InitAlloc made, the ones a free consumed
    const int selfKind = kindForCreator(ex.name);
    for (size_t k = 0; k < ex.params.size(); ++k) {
        const Param& p = ex.params[k];
        Arg& a = args[k];
        if (p.role == Role::ObjectOut && !a.null && a.buf >= 0 && selfKind >= 0) {
            void* obj;
            std::memcpy(&obj, bufs[a.buf].ptr, sizeof obj);
            const bool untouched = uintptr_t(obj) == uintptr_t(0x5EA7C0DE5EA7C0DEULL);
            if (!error && (untouched || !obj)) fail("succeeded but made no object");
            if (!error && !untouched && obj) madeObject = obj, madeKind = selfKind;
        }
        if (p.role == Role::Object && a.object && a.maker && !a.shared && ex.name == objectKinds()[p.objectKind].freer &&
            int32_t(result) == StatusOk) {
            if (!a.expected) fail("freed an object of another kind (" + std::string(objectKinds()[a.kind].name) + ")");
            a.consumed = true;
        }
        if (p.role == Role::Block && a.object) a.consumed = true, a.object = nullptr;
    }
    // Blocks of objects made before the call and consumed by it (a free).
    int64_t consumedBlocks = 0;
    for (const Arg& a : args)
        if (a.consumed) consumedBlocks += a.maker ? a.maker->blocksLeft : 1;
    // pointers the allocators return
    if (ex.result == Result::Pointer && result != 0 && family && family->resultFreer &&
        matchesPattern(ex.name, family->freedResults)) {
        const Export* f = findExport(family->resultFreer);
        if (f) {
            Slot s;
            put(s, reinterpret_cast<void*>(intptr_t(result)));
            f->invoke(entries[f->index], &s);
        }
    }
    // The call's own object goes first: with it freed, every block the call
    // took must be back, and those of the objects it consumed gone.
    if (madeObject && !keepObject) {
        std::string why;
        if (!freeObject(madeKind, madeObject, why)) fail(why);
        madeObject = nullptr;
    }
    if (opt.allocations && !keepObject) {
        const int64_t left = opt.allocations->live() - liveBefore + consumedBlocks;
        if (left != 0) fail("left " + std::to_string(left) + " block(s) allocated");
    }
    releaseObjects();
}

}  // namespace

// ---- Caller -----------------------------------------------------------------------------------------------------

Caller::Caller(std::vector<Entries> variants, Options options)
    : variants_(std::move(variants)), options_(std::move(options)) {}
Caller::~Caller() = default;

bool Caller::hasVariant(int k) const { return k >= 0 && k < int(variants_.size()) && !variants_[k].empty(); }

Outcome Caller::call(Source& src, int exportIndex, int variant) {
    Outcome out;
    const Export& ex = exports()[exportIndex];
    if (!ex.skipReason.empty() || !hasVariant(variant)) return out;
    CallState st(ex, variant, variants_, options_);
    st.rng.s = (uint64_t(src.u32()) << 1) | 1;
    st.failAllocation = options_.failAllocation;
    try {
        st.decode(src);
        if (st.failure.empty()) {
            st.layOut();
            st.fillSlots();
            st.execute();
        }
    } catch (const std::bad_alloc&) {
        // the process ran short of memory for the call's own buffers: not a call
        return out;
    }
    out.made = st.made;
    out.result = st.result;
    out.outputHash = st.outputHash();
    out.allocations = st.allocationsTaken;
    out.failure = st.failure;
    out.description = st.describe();
    for (const std::string& n : st.notes) out.description += "\n  made by " + n;
    return out;
}

Outcome Caller::next(Source& src) {
    const std::vector<Export>& all = exports();
    int index = int(src.u16() % all.size());
    for (size_t tries = 0; tries < all.size() && !all[index].skipReason.empty(); ++tries) index = int((index + 1) % all.size());
    std::vector<int> present;
    for (int k = 0; k < int(variants_.size()); ++k)
        if (hasVariant(k)) present.push_back(k);
    const int variant = present.empty() ? 0 : present[src.byte() % present.size()];
    return call(src, index, variant);
}

Outcome Caller::run(Source& src, uint64_t* calls) {
    for (int n = 0; n < options_.maxCallsPerInput && !src.exhausted(); ++n) {
        Outcome o = next(src);
        if (calls && o.made) ++*calls;
        if (!o.failure.empty()) return o;
    }
    return {};
}

// ---- seeds -----------------------------------------------------------------------------------------------------

namespace {

// Selectors that make a decoder take a literal.
constexpr uint8_t kCountLiteral = 5, kStepLiteral = 5, kCodeLiteral = 3, kRealLiteral = 3;

void encodeTypical(const Export& ex, Encoder& out);

void encodeParam(const Param& p, const std::string* text, Encoder& out) {
    auto literal = [&](uint8_t sel, uint32_t v) {
        out.byte(sel);
        out.u32(v);
    };
    auto typical = [&] {
        out.byte(0);
        out.u32(0);
    };
    auto number = [&](const std::string& s) -> int64_t { return std::strtoll(s.c_str(), nullptr, 0); };
    switch (p.role) {
    case Role::Count: text ? literal(kCountLiteral, uint32_t(number(*text))) : typical(); break;
    case Role::Step:
    case Role::Stride: text ? literal(kStepLiteral, uint32_t(number(*text))) : typical(); break;
    case Role::Code: text ? literal(kCodeLiteral, uint32_t(number(*text))) : typical(); break;
    case Role::Real: {
        const int parts = (p.type.kind == Kind::F32 || p.type.kind == Kind::F64) ? 1 : 2;
        const bool integerParts = p.type.kind == Kind::C16s || p.type.kind == Kind::C32s || p.type.kind == Kind::C64s;
        std::vector<double> v;
        if (text) {
            std::stringstream in(*text);
            std::string part;
            while (std::getline(in, part, ',')) v.push_back(std::strtod(part.c_str(), nullptr));
        }
        for (int k = 0; k < parts; ++k) {
            if (size_t(k) >= v.size()) {
                typical();
            } else if (integerParts) {
                literal(kCodeLiteral, uint32_t(int64_t(v[k])));
            } else {
                const float f = float(v[k]);
                uint32_t bits;
                std::memcpy(&bits, &f, 4);
                literal(kRealLiteral, bits);
            }
        }
        break;
    }
    case Role::Extent:
    case Role::Point: {
        int64_t x = 0, y = 0;
        const bool given = text && std::sscanf(text->c_str(), "%" SCNd64 "x%" SCNd64, &x, &y) == 2;
        const uint8_t sel = p.role == Role::Extent ? kCountLiteral : kCodeLiteral;
        if (given) literal(sel, uint32_t(x)), literal(sel, uint32_t(y));
        else typical(), typical();
        break;
    }
    case Role::Rect: {
        int64_t r[4] = {0, 0, 0, 0};
        const bool given = text && std::sscanf(text->c_str(), "%" SCNd64 ",%" SCNd64 ",%" SCNd64 ",%" SCNd64,
                                               &r[0], &r[1], &r[2], &r[3]) == 4;
        for (int k = 0; k < 4; ++k) given ? literal(k < 2 ? kCodeLiteral : kCountLiteral, uint32_t(r[k])) : typical();
        break;
    }
    case Role::Data:
    case Role::Result:
    case Role::ObjectOut: out.byte(text && *text == "0" ? kNull : 0); break;
    case Role::Values:
        out.byte(text && *text == "0" ? kNull : 0);
        for (int e = 0; e < std::max(1, p.extent); ++e) typical();
        break;
    case Role::Planes: {
        out.byte(text && *text == "0" ? kNull : 0);
        const int n = p.extent > 0 ? p.extent : 2;  // a typical count decodes to a small one
        for (int e = 0; e < std::min(n, 16); ++e) out.byte(0);
        break;
    }
    case Role::Object: {
        if (text && *text == "0") {
            out.byte(5);
            break;
        }
        out.byte(0);
        const Export* creator = findExport(objectKinds()[p.objectKind].creator);
        if (creator) encodeTypical(*creator, out);
        break;
    }
    case Role::Block: out.byte(text && *text == "0" ? 3 : 0); break;
    case Role::Unknown: break;
    }
}

void encodeTypical(const Export& ex, Encoder& out) {
    for (const Param& p : ex.params) encodeParam(p, nullptr, out);
}

}  // namespace

bool encodeCall(const std::string& line, Encoder& out) {
    std::stringstream in(line);
    std::string name;
    in >> name;
    const Export* ex = findExport(name);
    if (!ex || !ex->skipReason.empty()) return false;
    std::map<std::string, std::string> given;
    int variant = 0;
    std::string cell;
    while (in >> cell) {
        const size_t eq = cell.find('=');
        if (eq == std::string::npos) continue;
        if (cell.compare(0, eq, "variant") == 0) variant = std::atoi(cell.c_str() + eq + 1);
        else given[cell.substr(0, eq)] = cell.substr(eq + 1);
    }
    out.u16(uint16_t(ex->index));
    out.byte(uint8_t(variant));
    out.u32(0x9E3779B9u);  // contents
    for (const Param& p : ex->params) {
        const auto g = given.find(p.name);
        encodeParam(p, g == given.end() ? nullptr : &g->second, out);
    }
    return true;
}

}  // namespace zf
