#include "qx/host.h"

#include <cstring>
#include <type_traits>
#include <utility>

namespace {

template <class T>
T element(void *column, int64_t i) {
    if constexpr (std::is_pointer_v<T>)
        return static_cast<T>(column) + i;
    else
        return static_cast<const T *>(column)[i];
}

template <class Result, class... Arguments, std::size_t... K>
void callEach(Result (*function)(Arguments...), int64_t count, void *const *columns,
              ErrorCode *codes, std::index_sequence<K...>) {
    for (int64_t i = 0; i < count; ++i)
        if constexpr (std::is_void_v<Result>)
            function(element<Arguments>(columns[K], i)...);
        else
            codes[i] = function(element<Arguments>(columns[K], i)...);
}

template <class Result, class... Arguments>
void calls(QXHostFunction function, int64_t count, void *const *columns, ErrorCode *codes) {
    callEach(reinterpret_cast<Result (*)(Arguments...)>(function), count, columns, codes,
             std::index_sequence_for<Arguments...>());
}

using d = double;
using i = int32_t;
using D = double *;
using I = int32_t *;
using Z = CDB *;

struct Form {
    const char *letters;
    void (*calls)(QXHostFunction, int64_t, void *const *, ErrorCode *);
};

constexpr Form forms[] = {
    {"vdD", calls<void, d, D>},
    {"vdDD", calls<void, d, D, D>},
    {"vdDDDD", calls<void, d, D, D, D, D>},
    {"vddD", calls<void, d, d, D>},
    {"vddDi", calls<void, d, d, D, i>},
    {"vddDDDD", calls<void, d, d, D, D, D, D>},
    {"vdddD", calls<void, d, d, d, D>},
    {"vdddDi", calls<void, d, d, d, D, i>},
    {"vddddD", calls<void, d, d, d, d, D>},
    {"vdiD", calls<void, d, i, D>},
    {"vdiDD", calls<void, d, i, D, D>},
    {"vidD", calls<void, i, d, D>},
    {"viD", calls<void, i, D>},
    {"eDD", calls<int32_t, D, D>},
    {"eDDI", calls<int32_t, D, D, I>},
    {"eDIDI", calls<int32_t, D, I, D, I>},
    {"eDDIDI", calls<int32_t, D, D, I, D, I>},
    {"eDIDDI", calls<int32_t, D, I, D, D, I>},
    {"eDIIDI", calls<int32_t, D, I, I, D, I>},
    {"eDDDIDI", calls<int32_t, D, D, D, I, D, I>},
    {"eDIDDDI", calls<int32_t, D, I, D, D, D, I>},
    {"eZiZ", calls<int32_t, Z, i, Z>},
    {"edZiZ", calls<int32_t, d, Z, i, Z>},
};

} // namespace

int32_t QXHostCalls(QXHostFunction function, const char *form, int64_t count, void *const *columns,
                    ErrorCode *codes) {
    for (const Form &known : forms)
        if (std::strcmp(known.letters, form) == 0) {
            known.calls(function, count, columns, codes);
            return QXHostDone;
        }
    return QXHostBadArgument;
}
