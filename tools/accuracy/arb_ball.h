#ifndef QX_ACCURACY_ARB_BALL_H
#define QX_ACCURACY_ARB_BALL_H

#include <arb.h>

// A real ball of Arb that frees itself.
class Ball {
public:
    Ball() { arb_init(v); }
    Ball(double x) : Ball() { arb_set_d(v, x); }
    Ball(const Ball &other) : Ball() { arb_set(v, other.v); }
    Ball &operator=(const Ball &other) {
        arb_set(v, other.v);
        return *this;
    }
    ~Ball() { arb_clear(v); }
    double middle() const { return arf_get_d(arb_midref(v), ARF_RND_NEAR); }
    arb_t v;
};

#endif
