// The escapers of the string family against a plain std::string implementation of the same
// tables: special characters both ways, XML both ways and JSON, on a text without anything to
// escape (the common case, which must not copy) and on one full of special characters.
//
//   bench_escape --benchmark_filter=Xml --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/strings/DynamicString.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

namespace {

using tekit::DynamicString;
using tekit::String;

char const* const kPlainText = "Numeric Limit Test: measures the supply voltage on channel 3 and "
                               "compares it with the limits of the running sequence";
char const* const kSpecialText = "Path \"C:\\Tests\\a.seq\"\tline 1\r\nline 2 <b>&amp;</b> "
                                 "it's \x01\x02 done\\n";

// ---- The peer: the same tables written the obvious way over std::string. -------------------

std::string PlainEscapeSpecial(std::string const& in) {
    std::string out;
    for (char c : in) {
        switch (c) {
        case '\t':
            out += "\\t";
            break;
        case '\n':
            out += "\\n";
            break;
        case '"':
            out += "\\\"";
            break;
        case '\r':
            out += "\\r";
            break;
        case '\\':
            out += "\\\\";
            break;
        default:
            if (static_cast<unsigned char>(c) < 0x20 || c == 0x7F) {
                char hex[8];
                std::snprintf(hex, sizeof hex, "\\x%.2x", static_cast<unsigned char>(c));
                out += hex;
            } else {
                out += c;
            }
        }
    }
    return out;
}

std::string PlainUnescapeSpecial(std::string const& in) {
    std::string out;
    for (size_t i = 0; i < in.size(); ++i) {
        if (in[i] != '\\' || i + 1 == in.size()) {
            out += in[i];
            continue;
        }
        char const next = in[++i];
        switch (next) {
        case 't':
            out += '\t';
            break;
        case 'n':
            out += '\n';
            break;
        case 'r':
            out += '\r';
            break;
        case 'x':
            out += static_cast<char>(std::stoi(in.substr(i + 1, 2), nullptr, 16)), i += 2;
            break;
        default:
            out += next;
        }
    }
    return out;
}

std::string PlainEscapeXml(std::string const& in) {
    std::string out;
    for (char c : in) {
        switch (c) {
        case '<':
            out += "&lt;";
            break;
        case '>':
            out += "&gt;";
            break;
        case '&':
            out += "&amp;";
            break;
        default:
            out += c;
        }
    }
    return out;
}

std::string PlainUnescapeXml(std::string const& in) {
    static std::pair<char const*, char> const kEntities[] = {
        {"&lt;", '<'}, {"&gt;", '>'}, {"&amp;", '&'}, {"&apos;", '\''}, {"&quot;", '"'}};
    std::string out;
    for (size_t i = 0; i < in.size();) {
        bool replaced = false;
        for (auto const& [name, c] : kEntities) {
            if (in.compare(i, std::char_traits<char>::length(name), name) == 0) {
                out += c;
                i += std::char_traits<char>::length(name);
                replaced = true;
                break;
            }
        }
        if (!replaced)
            out += in[i++];
    }
    return out;
}

std::string PlainEscapeJson(std::string const& in) {
    std::string out;
    for (char c : in) {
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char code[8];
            std::snprintf(code, sizeof code, "\\u%.4X", static_cast<unsigned char>(c));
            out += code;
        } else {
            out += c;
        }
    }
    return out;
}

// ---- The benchmarks. ---------------------------------------------------------------------

template <class Op> void RunTekit(benchmark::State& state, char const* text, Op op) {
    DynamicString const source(text);
    for (auto _ : state) {
        DynamicString s(source);
        op(s);
        benchmark::DoNotOptimize(s);
    }
}

template <class Op> void RunPlain(benchmark::State& state, char const* text, Op op) {
    std::string const source(text);
    for (auto _ : state) {
        std::string s = op(source);
        benchmark::DoNotOptimize(s);
    }
}

void Register(char const* operation, char const* caseName, char const* text,
              void (*tekitOp)(String&), std::string (*plainOp)(std::string const&)) {
    std::string const name = std::string(operation) + "/" + caseName + "/";
    benchmark::RegisterBenchmark((name + "tekit").c_str(), RunTekit<void (*)(String&)>, text,
                                 tekitOp);
    benchmark::RegisterBenchmark((name + "std").c_str(),
                                 RunPlain<std::string (*)(std::string const&)>, text, plainOp);
}

void RegisterCase(char const* caseName, char const* text, char const* escapedText) {
    Register(
        "EscapeSpecial", caseName, text, [](String& s) { s.EscapeSpecialChars(false); },
        PlainEscapeSpecial);
    Register(
        "UnescapeSpecial", caseName, escapedText, [](String& s) { s.UnescapeSpecialChars(false); },
        PlainUnescapeSpecial);
    Register(
        "EscapeXml", caseName, text, [](String& s) { String::EscapeXmlChars(s, false); },
        PlainEscapeXml);
    Register(
        "UnescapeXml", caseName, text, [](String& s) { String::UnEscapeXmlChars(s); },
        PlainUnescapeXml);
    Register(
        "EscapeJson", caseName, text, [](String& s) { s.EscapeSpecialCharsForJSON(); },
        PlainEscapeJson);
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    static std::string const escapedSpecial = PlainEscapeSpecial(kSpecialText);
    RegisterCase("plain", kPlainText, kPlainText);
    RegisterCase("special", kSpecialText, escapedSpecial.c_str());
    tekit::bench::RatioReporter reporter("std");
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
