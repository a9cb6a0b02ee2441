// SPDX-License-Identifier: Apache-2.0

// Compares values with their peers: making and copying with boost::any and std::variant, comparing with std::variant, printing
// with std::to_chars, Poco and fmt, reading with a standard stream.

#include "TCIMValue.h"

#include <Poco/NumberFormatter.h>
#include <benchmark/benchmark.h>
#include <fmt/format.h>
#include <fmt/ranges.h>

#include <boost/any.hpp>
#include <charconv>
#include <cmath>
#include <random>
#include <sstream>
#include <string>
#include <variant>
#include <vector>

namespace {

using NQRVZEP20::TCIMValue;
using TType = TCIMValue::TCIMType;

constexpr int kCount = 1000;

// Numbers with any number of digits, the same in each run.
std::vector<unsigned int> Numbers() {
  std::mt19937 random(1983);
  std::vector<unsigned int> numbers(kCount);
  for (unsigned int& number : numbers) number = random() >> random() % 32;
  return numbers;
}

// Numbers of the full 32 bits, such as identifiers and addresses.
std::vector<unsigned int> WideNumbers() {
  std::mt19937 random(1983);
  std::vector<unsigned int> numbers(kCount);
  for (unsigned int& number : numbers) number = random();
  return numbers;
}

std::vector<double> Reals() {
  std::mt19937 random(1983);
  std::uniform_real_distribution<double> percent(0, 100);
  std::vector<double> reals(kCount);
  for (double& real : reals) real = percent(random);
  return reals;
}

// Numbers of nearly every magnitude that a double can have.
std::vector<double> WideReals() {
  std::mt19937 random(1983);
  std::uniform_real_distribution<double> exponent(-300, 300);
  std::vector<double> reals(kCount);
  for (double& real : reals) real = std::pow(10.0, exponent(random));
  return reals;
}

template <class TNumber>
std::vector<TCIMValue> ValuesOf(std::vector<TNumber> const& numbers) {
  return {numbers.begin(), numbers.end()};
}

// Reports the number of items processed in a second.
void CountItems(benchmark::State& state) { state.SetItemsProcessed(state.iterations() * kCount); }

// ---- Making and copying ----

void Make_Zep(benchmark::State& state) {
  unsigned int number = 0;
  for (auto _ : state) {
    TCIMValue value(++number);
    benchmark::DoNotOptimize(value);
  }
}
BENCHMARK(Make_Zep);

void Make_BoostAny(benchmark::State& state) {
  unsigned int number = 0;
  for (auto _ : state) {
    boost::any value(++number);
    benchmark::DoNotOptimize(value);
  }
}
BENCHMARK(Make_BoostAny);

template <class TValue>
void Copy(benchmark::State& state) {
  TValue const value(1983u);
  for (auto _ : state) {
    TValue copy(value);
    benchmark::DoNotOptimize(copy);
  }
}
void Copy_Zep(benchmark::State& state) { Copy<TCIMValue>(state); }
void Copy_BoostAny(benchmark::State& state) { Copy<boost::any>(state); }
BENCHMARK(Copy_Zep);
BENCHMARK(Copy_BoostAny);

// A std::variant of the types of a value, which has its strings in place, too.
using TVariant = std::variant<std::monostate, bool, unsigned char, signed char, unsigned short, short, unsigned int, int,
                              unsigned long, long, float, double, std::string>;

std::string const kShortText = "ProductName1", kLongText(64, 'x');

template <class TValue>
void MakeString(benchmark::State& state, std::string const& text) {
  for (auto _ : state) {
    TValue value(text);
    benchmark::DoNotOptimize(value);
  }
}
void MakeString_Zep(benchmark::State& state) { MakeString<TCIMValue>(state, kShortText); }
BENCHMARK(MakeString_Zep);
void MakeString_Variant(benchmark::State& state) { MakeString<TVariant>(state, kShortText); }
BENCHMARK(MakeString_Variant);

template <class TValue>
void CopyString(benchmark::State& state, std::string const& text) {
  TValue const value(text);
  for (auto _ : state) {
    TValue copy(value);
    benchmark::DoNotOptimize(copy);
  }
}
void CopyString_Zep(benchmark::State& state) { CopyString<TCIMValue>(state, kShortText); }
BENCHMARK(CopyString_Zep);
void CopyString_Variant(benchmark::State& state) { CopyString<TVariant>(state, kShortText); }
BENCHMARK(CopyString_Variant);

// ---- Comparing ----

template <class TValue, class TSource>
void Equal(benchmark::State& state, TSource const& source) {
  TValue left(source), right(source);
  for (auto _ : state) {
    benchmark::DoNotOptimize(left);
    benchmark::DoNotOptimize(left == right);
  }
}
void EqualNumber_Zep(benchmark::State& state) { Equal<TCIMValue, unsigned int>(state, 1983u); }
BENCHMARK(EqualNumber_Zep);
void EqualNumber_Variant(benchmark::State& state) { Equal<TVariant, unsigned int>(state, 1983u); }
BENCHMARK(EqualNumber_Variant);
void EqualString_Zep(benchmark::State& state) { Equal<TCIMValue, std::string>(state, kLongText); }
BENCHMARK(EqualString_Zep);
void EqualString_Variant(benchmark::State& state) { Equal<TVariant, std::string>(state, kLongText); }
BENCHMARK(EqualString_Variant);

// ---- Arrays ----

template <class TValue>
void CopyArray(benchmark::State& state, TValue const& array) {
  for (auto _ : state) {
    TValue copy(array);
    benchmark::DoNotOptimize(copy);
  }
}
void CopyArray_Zep(benchmark::State& state) { CopyArray(state, TCIMValue(TType::kCIMTypeUint32, 0, ValuesOf(Numbers()))); }
void CopyArray_BoostAny(benchmark::State& state) {
  std::vector<unsigned int> const numbers = Numbers();
  CopyArray(state, std::vector<boost::any>(numbers.begin(), numbers.end()));
}
BENCHMARK(CopyArray_Zep);
BENCHMARK(CopyArray_BoostAny);

// ---- Text ----

template <class TNumber, class TPrint>
void PrintEach(benchmark::State& state, std::vector<TNumber> const& numbers, TPrint const& print) {
  for (auto _ : state)
    for (TNumber const& number : numbers) {
      std::string text = print(number);
      benchmark::DoNotOptimize(text);
    }
  CountItems(state);
}

std::string Printed(TCIMValue const& value) { return value.ToString(); }
std::string PrintedInHex(TCIMValue const& value) { return value.ToString(16); }

void Decimal_Zep(benchmark::State& state) { PrintEach(state, ValuesOf(Numbers()), Printed); }
void Decimal_ToChars(benchmark::State& state) {
  PrintEach(state, Numbers(), [](unsigned int number) {
    char buffer[16];
    return std::string(buffer, std::to_chars(buffer, buffer + sizeof buffer, number).ptr);
  });
}
BENCHMARK(Decimal_Zep);
BENCHMARK(Decimal_ToChars);

void Hex_Zep(benchmark::State& state) { PrintEach(state, ValuesOf(WideNumbers()), PrintedInHex); }
void Hex_Poco(benchmark::State& state) {
  PrintEach(state, WideNumbers(), [](unsigned int number) { return Poco::NumberFormatter::formatHex(number, 8); });
}
BENCHMARK(Hex_Zep);
BENCHMARK(Hex_Poco);

void Real_Zep(benchmark::State& state) { PrintEach(state, ValuesOf(Reals()), Printed); }
void Real_Fmt(benchmark::State& state) {
  PrintEach(state, Reals(), [](double number) { return fmt::format("{:g}", number); });
}
BENCHMARK(Real_Zep);
BENCHMARK(Real_Fmt);

void WideReal_Zep(benchmark::State& state) { PrintEach(state, ValuesOf(WideReals()), Printed); }
void WideReal_Fmt(benchmark::State& state) {
  PrintEach(state, WideReals(), [](double number) { return fmt::format("{:g}", number); });
}
BENCHMARK(WideReal_Zep);
BENCHMARK(WideReal_Fmt);

void ArrayText_Zep(benchmark::State& state) {
  TCIMValue const array(TType::kCIMTypeUint32, 0, ValuesOf(Numbers()));
  for (auto _ : state) {
    std::string text = array.ToString();
    benchmark::DoNotOptimize(text);
  }
}
void ArrayText_FmtJoin(benchmark::State& state) {
  std::vector<unsigned int> const numbers = Numbers();
  for (auto _ : state) {
    std::string text = fmt::format("{{ {} }}", fmt::join(numbers, ", "));
    benchmark::DoNotOptimize(text);
  }
}
BENCHMARK(ArrayText_Zep);
BENCHMARK(ArrayText_FmtJoin);

// ---- Reading ----

template <class TNumber, class TRead>
void ReadEach(benchmark::State& state, std::vector<TNumber> const& numbers, TRead const& read) {
  std::vector<std::string> texts;
  for (TNumber const& number : numbers) texts.push_back(fmt::format("{}", number));
  for (auto _ : state)
    for (std::string& text : texts) read(text);
  CountItems(state);
}

template <class TNumber>
void ReadWithStream(std::string& text) {
  std::istringstream stream(text);
  TNumber number = 0;
  stream >> number;
  benchmark::DoNotOptimize(number);
}

template <TType::ECIMType type>
void ReadValue(std::string& text) {
  TCIMValue value(type, text, nullptr);
  benchmark::DoNotOptimize(value);
}

void Read_Zep(benchmark::State& state) { ReadEach(state, Numbers(), ReadValue<TType::kCIMTypeUint32>); }
void Read_Stream(benchmark::State& state) { ReadEach(state, Numbers(), ReadWithStream<unsigned int>); }
BENCHMARK(Read_Zep);
BENCHMARK(Read_Stream);

void ReadReal_Zep(benchmark::State& state) { ReadEach(state, Reals(), ReadValue<TType::kCIMTypeReal64>); }
void ReadReal_Stream(benchmark::State& state) { ReadEach(state, Reals(), ReadWithStream<double>); }
BENCHMARK(ReadReal_Zep);
BENCHMARK(ReadReal_Stream);

}  // namespace
