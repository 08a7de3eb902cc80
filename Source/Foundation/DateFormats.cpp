#include "Foundation/DateFormats.h"

#include <algorithm>
#include <iterator>

namespace Foundation {

namespace {

// The order decides every ambiguity: "3/4/05" is 4 March, since m-d-y stands before d-m-y.
constexpr DateFormat kFormats[] = {
    DateFormat("[A][,] B d[,] H:M:S [p] Y[,] [Z]"),
    DateFormat("[A][,] B d[,] [Y][,] H:M:S [p] [Z]"),
    DateFormat("[A][,] B d[,] [Y][,] H:M [p][,] [Z]"),
    DateFormat("[A][,] B d[,] [Y][,] H [p][,] [Z]"),
    DateFormat("[A][,] B d[,] H:M [p][,] [Y] [Z]"),
    DateFormat("[A][,] d B[,] [Y][,] H:M [p][,] [Z]"),
    DateFormat("[A][,] d B[,] [Y][,] H:M:S [p][,] [Z]"),
    DateFormat("[A][,] d B[,] H:M:S [Y][,] [p][,] [Z]"),
    DateFormat("[A][,] d B[,] H:M [p][,] [Y][,] [Z]"),
    DateFormat("d.m.y[,] H:M:S [p] [Z]"),
    DateFormat("d.m.y[,] H:M [p] [Z]"),
    DateFormat("d.m.y"),
    DateFormat("[A][,] m-d-y[,] [H][:][M] [p]"),
    DateFormat("[A][,] m-d[,] H:M [p]"),
    DateFormat("[A][,] m-d[,] H[p]"),
    DateFormat("[A][,] m-d"),
    DateFormat("[A][,] B d[,] Y"),
    DateFormat("[A][,] H:M [p]"),
    DateFormat("[A][,] H [p]"),
    DateFormat("H:M [p][,] [A]"),
    DateFormat("H [p][,] [A]"),
    DateFormat("[A][,] B d[,] H:M:S [p] [Z] [Y]"),
    DateFormat("[A][,] B d[,] H:M [p] [Z] [Y]"),
    DateFormat("[A][,] d B [,] H:M:S [p] [Z] [Y]"),
    DateFormat("[A][,] d B [,] H:M [p] [Z] [Y]"),
    DateFormat("[A][,] d-B-Y H:M:S [p] [Z]"),
    DateFormat("[A][,] d-B-Y H:M [p] [Z]"),
    DateFormat("d B Y H:M:S [Z]"),
    DateFormat("d B Y H:M [Z]"),
    DateFormat("y-m-d"),
    DateFormat("y-m-d [t] H:M:S [p] [Z]"),
    DateFormat("y-m-d [t] H:M [p] [Z]"),
    DateFormat("m-d-y H[p]"),
    DateFormat("m-d-y H:M[p]"),
    DateFormat("m-d-y H:M:S[p]"),
    DateFormat("H[p][,] m-d-y"),
    DateFormat("H:M[p][,] m-d-y"),
    DateFormat("H:M:S[p][,] m-d-y"),
    DateFormat("H[p][,] d-m-y"),
    DateFormat("H:M[p][,] d-m-y"),
    DateFormat("H:M:S[p][,] d-m-y"),
    DateFormat("A[,] H:M:S [p] [Z]"),
    DateFormat("A[,] H:M [p] [Z]"),
    DateFormat("H:M:S [p] [Z]"),
    DateFormat("H:M [p] [Z]"),
    DateFormat("A[,] [B] [d] [Y]"),
    DateFormat("A[,] [d] [B] [Y]"),
    DateFormat("B d[,][Y] H[p][,] [Z]"),
    DateFormat("B d[,] H[p]"),
    DateFormat("B d [,] H:M [p]"),
    DateFormat("d B [,][Y] H [p] [Z]"),
    DateFormat("d B [,] H:M [p]"),
    DateFormat("B d [,][Y]"),
    DateFormat("B d [,] H:M [p][,] [Y]"),
    DateFormat("B d [,] H [p][,] [Y]"),
    DateFormat("d B [,][Y]"),
    DateFormat("H[p] [,] B d"),
    DateFormat("H:M[p] [,] B d"),
    DateFormat("H [p]"),
    DateFormat("[A][,] d B[,] H:M:S [Y][,] [p][,] [Z]"),
};
static_assert(std::size(kFormats) == 60);
static_assert(std::all_of(std::begin(kFormats), std::end(kFormats), [](const DateFormat& format) {
    return format.longest() <= DateTokens::kCapacity;
}));

}  // namespace

std::span<const DateFormat> dateFormats() noexcept {
    return kFormats;
}

}  // namespace Foundation
