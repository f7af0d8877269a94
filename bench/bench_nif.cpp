// Time of one tax-number check, for a valid and an invalid number of every country. The
// invalid ones have the right form and a wrong check character, so they run the whole
// computation (Bulgaria's tries all three of its 10-digit forms).

#include "validation/nifValidator.h"

#include <QString>

#include <benchmark/benchmark.h>

#include <string>

using namespace zelctl::nifValidator;

namespace {

struct Sample
{
    const char16_t *code;
    const char16_t *valid;
    const char16_t *invalid;
};

constexpr Sample samples[] = {
    { u"AT", u"U10223006", u"U10223007" },
    { u"BE", u"0234567873", u"0234567874" },
    { u"BG", u"7523169263", u"7523169266" },
    { u"CY", u"10259584H", u"10259584A" },
    { u"CZ", u"8562311230", u"8562311231" },
    { u"DE", u"136458019", u"136458010" },
    { u"DK", u"13181810", u"13181811" },
    { u"EE", u"100207172", u"100207173" },
    { u"EL", u"094531660", u"094531661" },
    { u"ES", u"12345678Z", u"12345678A" },
    { u"FI", u"20777482", u"20777483" },
    { u"FR", u"83404833048", u"84404833048" },
    { u"GB", u"987654353", u"987654354" },
    { u"HU", u"12892305", u"12892306" },
    { u"IE", u"6433435F", u"6433435G" },
    { u"IT", u"07620150123", u"07620150124" },
    { u"LT", u"119331410", u"119331411" },
    { u"LU", u"12345613", u"12345614" },
    { u"LV", u"40003512171", u"40003512172" },
    { u"MT", u"11679513", u"11679514" },
    { u"NL", u"004619109B01", u"004619100B01" },
    { u"PL", u"5260000181", u"5260000182" },
    { u"PT", u"123456789", u"123456780" },
    { u"RO", u"1859319", u"1859310" },
    { u"SE", u"556188840401", u"556188840501" },
    { u"SI", u"15110303", u"15110304" },
    { u"SK", u"2022744966", u"2022744967" },
};

void checkNumber(benchmark::State &state, int countryIndex, QStringView number, bool expected)
{
    if (CheckTaxNumber(number, countryIndex) != expected) {
        state.SkipWithError("the sample does not get the expected answer");
        return;
    }
    for (auto _ : state) {
        benchmark::DoNotOptimize(number);
        bool valid = CheckTaxNumber(number, countryIndex);
        benchmark::DoNotOptimize(valid);
    }
}

void lookUpCountry(benchmark::State &state)
{
    QStringView code = u"SK";
    for (auto _ : state) {
        benchmark::DoNotOptimize(code);
        int index = CountryIndex(code);
        benchmark::DoNotOptimize(index);
    }
}

} // namespace

int main(int argc, char **argv)
{
    for (const Sample &sample : samples) {
        const int index = CountryIndex(sample.code);
        const std::string name = "CheckTaxNumber/" + QStringView(sample.code).toString().toStdString();
        benchmark::RegisterBenchmark((name + "/valid").c_str(), checkNumber, index, QStringView(sample.valid), true);
        benchmark::RegisterBenchmark(
            (name + "/invalid").c_str(), checkNumber, index, QStringView(sample.invalid), false);
    }
    benchmark::RegisterBenchmark("CountryIndex/SK", lookUpCountry);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
