#include <cmath>
#include <cstdlib>
#include <limits>

#include "providers/embedded/Function.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

bool isReal(const Call& call) { return call.isReal(0) || (call.count() > 1 && call.isReal(1)); }

Failure intOverflow() { return sqlFailure(8115, "Arithmetic overflow error converting expression to data type int."); }

// `overflowed`: 64 bits did not hold the result either.
void giveInt(Call& call, bool overflowed, std::int64_t value) {
  if (overflowed || value < std::numeric_limits<std::int32_t>::min() ||
      value > std::numeric_limits<std::int32_t>::max())
    throw intOverflow();
  call.give(value);
}

void add(Call& call) {
  if (isReal(call)) return call.give(call.real(0) + call.real(1));
  std::int64_t result = 0;
  const bool overflowed = __builtin_add_overflow(call.whole(0), call.whole(1), &result);
  giveInt(call, overflowed, result);
}

void subtract(Call& call) {
  if (isReal(call)) return call.give(call.real(0) - call.real(1));
  std::int64_t result = 0;
  const bool overflowed = __builtin_sub_overflow(call.whole(0), call.whole(1), &result);
  giveInt(call, overflowed, result);
}

void multiply(Call& call) {
  if (isReal(call)) return call.give(call.real(0) * call.real(1));
  std::int64_t result = 0;
  const bool overflowed = __builtin_mul_overflow(call.whole(0), call.whole(1), &result);
  giveInt(call, overflowed, result);
}

void negate(Call& call) {
  if (isReal(call)) return call.give(-call.real(0));
  std::int64_t result = 0;
  const bool overflowed = __builtin_sub_overflow(std::int64_t{0}, call.whole(0), &result);
  giveInt(call, overflowed, result);
}

Failure divideByZero() { return sqlFailure(8134, "Divide by zero error encountered."); }

void divide(Call& call) {
  if (call.real(1) == 0) throw divideByZero();
  if (isReal(call)) return call.give(call.real(0) / call.real(1));
  if (call.whole(1) == -1 && call.whole(0) == std::numeric_limits<std::int64_t>::min()) throw intOverflow();
  call.give(call.whole(0) / call.whole(1));
}

void modulo(Call& call) {
  if (call.real(1) == 0) throw divideByZero();
  if (isReal(call)) return call.give(std::fmod(call.real(0), call.real(1)));
  call.give(call.whole(1) == -1 ? 0 : call.whole(0) % call.whole(1));
}

void absolute(Call& call) {
  if (call.isReal(0)) return call.give(std::abs(call.real(0)));
  if (call.whole(0) == std::numeric_limits<std::int64_t>::min()) throw intOverflow();
  call.give(std::abs(call.whole(0)));
}

double rounded(double value, std::int64_t digits) {
  const double scale = std::pow(10.0, static_cast<double>(digits));
  const double scaled = value * scale;
  return std::isfinite(scaled) && scale != 0 ? std::round(scaled) / scale : (digits < 0 ? 0 : value);
}

void roundNumber(Call& call) {
  const double result = rounded(call.real(0), call.whole(1));
  if (call.isReal(0)) return call.give(result);
  if (call.whole(1) >= 0) return call.give(call.whole(0));
  call.give(std::int64_t{std::llround(result)});
}

template <double (*function)(double)>
void toWhole(Call& call) {
  call.give(call.isReal(0) ? Value(function(call.real(0))) : Value(call.whole(0)));
}

double lower(double value) { return std::floor(value); }
double upper(double value) { return std::ceil(value); }

constexpr Function functions[] = {{"t_add", 2, add},
                                  {"t_subtract", 2, subtract},
                                  {"t_multiply", 2, multiply},
                                  {"t_negate", 1, negate},
                                  {"t_divide", 2, divide},
                                  {"t_modulo", 2, modulo},
                                  {"t_abs", 1, absolute},
                                  {"t_round", 2, roundNumber},
                                  {"t_floor", 1, toWhole<lower>},
                                  {"t_ceiling", 1, toWhole<upper>}};

}  // namespace

std::span<const Function> numberFunctions() { return functions; }

}  // namespace QVSa::embedded
