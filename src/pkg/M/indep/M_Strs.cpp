// The message table. The order is the numbering: entry i carries the key with number i.

#include "Mp_Strs.h"

#include <iterator>

#include "U.h"

namespace {

constexpr uint64_t kAllOnes = ~uint64_t{0};

}  // namespace

extern "C" {

Mp_StrEntry M_G_ztab[] = {
    {"$$$/QV/M/LStr/0000=unknown error (%d).", {}},
    {"$$$/QV/M/LStr/0001=underflow %s.", {}},
    {"$$$/QV/M/LStr/0002=overflow %s.", {}},
    {"$$$/QV/M/LStr/0003=divide by zero %s.", {}},
    {"$$$/QV/M/LStr/0004=trig table initialization.", {}},
    {"$$$/QV/M/LStr/0005=Gaussian table initialization.", {}},
    {"$$$/QV/M/LStr/0006=FCM/D table", {}},
    {"$$$/QV/M/LStr/0007=attempt to use unrequested math service (%s).", {}},
    {"$$$/QV/M/LStr/0008=fast character math will be unavailable.", {}},
    {"$$$/QV/M/LStr/0009=FCMD unprepare without prepare.", {}},
    {"$$$/QV/M/LStr/0010=zero denominator %s.", {}},
    {"$$$/QV/M/LStr/0011=in ratio addition", {}},
    {"$$$/QV/M/LStr/0012=in ratio subtraction", {}},
    {"$$$/QV/M/LStr/0013=in ratio multiply", {}},
    {"$$$/QV/M/LStr/0014=converting ratio denominators", {}},
    {"$$$/QV/M/LStr/0015=comparing ratios", {}},
    {"$$$/QV/M/LStr/0016=invalid rational range", {}},
    {"$$$/QV/M/LStr/0017=in ratio span", {}},
    {"$$$/QV/M/LStr/0018=fast char math", {}},
    {"$$$/QV/M/LStr/0019=in fixed multiply", {}},
    {"$$$/QV/M/LStr/0020=in fixed divide", {}},
    {"$$$/QV/M/LStr/0021=in fix24 multiply", {}},
    {"$$$/QV/M/LStr/0022=in fix24 divide", {}},
    {"$$$/QV/M/LStr/0023=in matrix conversion", {}},
    {"$$$/QV/M/LStr/0024=unable to invert matrix.", {}},
    {"$$$/QV/M/LStr/0025=in fixed point transformation", {}},
    {"$$$/QV/M/LStr/0026=in point transformation", {}},
    {"$$$/QV/M/LStr/0027=in fixed vector transformation", {}},
    {"$$$/QV/M/LStr/0028=unimplemented on this platform", {}},
    {"$$$/QV/M/LStr/0029=in ratio divide", {}},
    {"$$$/QV/M/LStr/0030=Trig table", {}},
    {"$$$/QV/M/LStr/0031=fast trig", {}},
    {"$$$/QV/M/LStr/0032=fast trig will be unavailable.", {}},
    {"$$$/QV/M/LStr/0033=Fast Trig unprepare without prepare.", {}},
    {"$$$/QV/M/LStr/0034=unable to decompose matrix.", {}},
    {"$$$/QV/M/LStr/0035=unable to build rotation matrix.", {}},
    {"$$$/QV/M/LStr/0036=unable to calculate normal vector.", {}},
    {"$$$/QV/M/LStr/0037=unable to intersect plane.", {}},
    {"$$$/QV/M/LStr/0038=cannot normalize zero vector", {}},
    {"$$$/QV/M/LStr/0039=in vector divide", {}},
    {"$$$/QV/M/LStr/0040=homogeneous point has W=0", {}},
    // Spelt so on purpose: translators' catalogues are keyed by this text.
    {"$$$/QV/M/LStr/0041=attempt to normalize a homegeneous point", {}},
    {nullptr, {kAllOnes, kAllOnes, 0}},
};

Mp_StrHeader M_G_zhdr = {"M", std::size(M_G_ztab), M_G_ztab, 0};
Mp_StrRef M_G_zref = {&M_G_zhdr, 0};

}  // extern "C"

static_assert(std::size(M_G_ztab) == Mp_STR_NORMALIZE_HOMOGENEOUS + 2);

const char* Mp::Text(int32_t index) { return U_ZLookupLStrCache(M_G_zref.header, index, 0, 0); }
