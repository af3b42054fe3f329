#include <gtest/gtest.h>

#include <random>
#include <sstream>

#include "retrieval/NumberText.h"

namespace {

using namespace StatsRegistry::NumberText;

template <typename T>
bool StreamParse(const std::string& text, T& value) {
    std::istringstream in(text);
    in >> std::dec >> value;
    return !(in.fail() || in.bad());
}

// The generated texts mix blanks, signs, digits, letters and NULs around the 64-bit edges.
std::vector<std::string> Texts() {
    std::vector<std::string> texts = {"", " ", "+", "-", "+-1", "-+1", "- 1", "42", " 42", "+42", "-1", "12abc",
                                      "0x1f", "abc", "\t\n\v\f\r7", "007", "-0", "+0",
                                      "9223372036854775807", "9223372036854775808", "-9223372036854775808",
                                      "-9223372036854775809", "18446744073709551615", "18446744073709551616",
                                      "-18446744073709551615", "-18446744073709551616", "99999999999999999999999",
                                      std::string("12\0" "34", 5), std::string("\0" "1", 2), "1 2", "١٢"};
    std::mt19937 rng(12345);
    const std::string alphabet = std::string(" \t+-0123456789ax*\n", 18) + std::string(1, '\0');
    for (int i = 0; i < 200000; ++i) {
        std::string t;
        const int len = static_cast<int>(rng() % 24);
        for (int k = 0; k < len; ++k) {
            // Mostly digits, so that long numbers near the range edges come up often.
            t += (rng() % 3 != 0) ? static_cast<char>('0' + rng() % 10) : alphabet[rng() % alphabet.size()];
        }
        texts.push_back(t);
    }
    for (const char* edge : {"9223372036854775807", "18446744073709551615"}) {
        std::string e = edge;
        for (int d = 0; d < 10; ++d) {
            for (size_t pos = 0; pos < e.size(); ++pos) {
                std::string v = e;
                v[pos] = static_cast<char>('0' + d);
                texts.push_back(v);
                texts.push_back("-" + v);
                texts.push_back(v + "0");
            }
        }
    }
    return texts;
}

TEST(NumberText, ParsersAgreeWithStreamExtraction) {
    for (const std::string& text : Texts()) {
        long long s = 77, sRef = 0;
        const bool sOk = ParseSigned64(text, s);
        ASSERT_EQ(sOk, StreamParse(text, sRef)) << '"' << text << '"';
        if (sOk) ASSERT_EQ(s, sRef) << '"' << text << '"';
        else ASSERT_EQ(s, 77) << "failure must leave the output alone";

        unsigned long long u = 77, uRef = 0;
        const bool uOk = ParseUnsigned64(text, u);
        ASSERT_EQ(uOk, StreamParse(text, uRef)) << '"' << text << '"';
        if (uOk) ASSERT_EQ(u, uRef) << '"' << text << '"';
        else ASSERT_EQ(u, 77u);
    }
}

TEST(NumberText, FormatAgreesWithStreamInsertion) {
    std::mt19937_64 rng(7);
    std::vector<unsigned long long> values = {0, 1, 9, 10, 4294967295ull, 9223372036854775808ull, ~0ull};
    for (int i = 0; i < 10000; ++i) values.push_back(rng() >> (rng() % 64));
    for (unsigned long long v : values) {
        std::ostringstream out;
        out << v;
        ASSERT_EQ(FormatUnsigned64(v), out.str());
        std::string appended = "x";
        AppendUnsigned64(appended, v);
        ASSERT_EQ(appended, "x" + out.str());
    }
}

}  // namespace
