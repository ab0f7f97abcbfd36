// The entry wrapper's floating-point mode: flush-to-zero and
// denormals-are-zero inside every entry, the caller's control word afterwards.
#include <gtest/gtest.h>
#include <xmmintrin.h>

#include "jni/entry.h"

namespace {

struct CsrRestore {
    unsigned int saved = _mm_getcsr();
    ~CsrRestore() { _mm_setcsr(saved); }
};

TEST(EntryFpMode, DenormalsFlushedInsideCallerWordRestoredAfter) {
    CsrRestore restore;
    for (unsigned int caller : {0x1F80u, 0x1F80u | 0x8040u, 0x1F80u | 0x6000u /* round toward zero */}) {
        _mm_setcsr(caller);
        unsigned int inside = guarded(nullptr, [] {
            volatile float tiny = 1e-38f;
            volatile float half = tiny * 0.001f;  // a denormal without flush-to-zero
            EXPECT_EQ(0.0f, half);
            unsigned int csr = _mm_getcsr();
            _mm_setcsr(csr | 0x6000);  // the body may change the mode: it does not leak out
            return csr;
        });
        EXPECT_EQ(0x8040u, inside & 0x8040u) << std::hex << caller;
        EXPECT_EQ(caller & 0x6000u, inside & 0x6000u) << "rounding mode kept";
        EXPECT_EQ(caller, _mm_getcsr() & ~0x3Fu) << std::hex << caller;
    }
}

TEST(EntryFpMode, RestoredWhenAFailureUnwinds) {
    CsrRestore restore;
    _mm_setcsr(0x1F80);
    // The wrapper's failure handlers need a JVM; the unwinding itself goes
    // through this scope object, exercised directly.
    try {
        entry_detail::fp_mode_scope scope;
        EXPECT_EQ(0x8040u, _mm_getcsr() & 0x8040u);
        throw 1;
    } catch (int) {
    }
    EXPECT_EQ(0x1F80u, _mm_getcsr() & ~0x3Fu);
}

}  // namespace
