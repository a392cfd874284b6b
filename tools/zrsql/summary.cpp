#include "summary.h"

#include <algorithm>
#include <cmath>

namespace zr::tool {

namespace {

double seconds(std::chrono::milliseconds time) {
    return std::chrono::duration<double>(time).count();
}

}  // namespace

std::string rateText(std::uint64_t count, std::chrono::milliseconds elapsed) {
    const double passed = std::max(seconds(elapsed), 0.001);
    return std::to_string(std::llround(static_cast<double>(count) / passed)) + "/s";
}

std::string clockText(double seconds) {
    const auto whole = static_cast<std::uint64_t>(std::ceil(seconds));
    const auto twoDigits = [](std::uint64_t number) {
        return (number < 10 ? "0" : "") + std::to_string(number);
    };
    const std::uint64_t hours = whole / 3600, minutes = whole / 60 % 60;
    const std::string front =
        hours ? std::to_string(hours) + ":" + twoDigits(minutes) : std::to_string(minutes);
    return front + ":" + twoDigits(whole % 60);
}

std::string counted(std::uint64_t count, const char* one, const char* many) {
    return std::to_string(count) + " " + (count == 1 ? one : many);
}

std::string summaryText(const Summary& summary) {
    std::string text = summary.interrupted ? "interrupted: " : "";
    for (const std::string& part : summary.parts) text += part + ", ";
    text += clockText(seconds(summary.elapsed));
    if (summary.counted) text += " (" + rateText(*summary.counted, summary.elapsed) + ")";
    if (!summary.goesOn.empty()) text += "; " + summary.goesOn;
    return text;
}

}  // namespace zr::tool
