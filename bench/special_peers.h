#ifndef QX_BENCH_SPECIAL_PEERS_H
#define QX_BENCH_SPECIAL_PEERS_H

#include "bench/special_rows.h"

// How a row names its peers: QX_CALL(expression of a and b) for libraries that are always there, QX_GSL and
// QX_BOOST for those that may not be installed. A file that uses one of these includes the peer's header
// under QX_PEER_GSL or QX_PEER_BOOST.

#ifdef QX_PEER_GSL
#include <gsl/gsl_sf.h>
#endif

#define QX_CALL(expression)                                                                        \
    [](double a, double b) -> double {                                                             \
        (void)a;                                                                                   \
        (void)b;                                                                                   \
        return expression;                                                                         \
    }
#ifdef QX_PEER_GSL
#define QX_GSL(expression) QX_CALL(expression)
#else
#define QX_GSL(expression) nullptr
#endif
#ifdef QX_PEER_BOOST
#define QX_BOOST(expression) QX_CALL(expression)
#else
#define QX_BOOST(expression) nullptr
#endif

namespace qx::bench {

// The peers in the order GSL, C++ library, Boost; null for a peer without the function.
inline Peers Of(SpecialRow::Function gsl, SpecialRow::Function standard,
                SpecialRow::Function boost) {
    Peers peers;
    if (gsl != nullptr)
        peers.push_back({"GSL", gsl});
    if (standard != nullptr)
        peers.push_back({"C++", standard});
    if (boost != nullptr)
        peers.push_back({"Boost", boost});
    return peers;
}

// The peers of a revision: also the elder of which it is the revision.
inline Peers WithElder(Peers peers, SpecialRow::Function elder) {
    peers.push_back({kElder, elder});
    return peers;
}

} // namespace qx::bench

#endif
