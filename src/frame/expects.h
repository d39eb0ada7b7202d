#ifndef QX_FRAME_EXPECTS_H
#define QX_FRAME_EXPECTS_H

// A condition that an inner routine relies on because its callers have checked it. Debug and
// sanitizer builds stop where it does not hold; other builds do not evaluate it.
#ifdef QX_CHECKED
#define QX_EXPECTS(condition) ((condition) ? static_cast<void>(0) : __builtin_trap())
#else
#define QX_EXPECTS(condition) static_cast<void>(0)
#endif

#endif
