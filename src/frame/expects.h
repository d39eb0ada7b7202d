#ifndef QX_FRAME_EXPECTS_H
#define QX_FRAME_EXPECTS_H

// What an inner routine relies on because its callers have checked it. Debug and sanitized builds
// stop where it does not hold; others take no time for it.
#ifdef QX_CHECKED
#define QX_EXPECTS(condition) ((condition) ? static_cast<void>(0) : __builtin_trap())
#else
#define QX_EXPECTS(condition) static_cast<void>(0)
#endif

#endif
