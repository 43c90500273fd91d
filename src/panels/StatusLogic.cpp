#include "panels/StatusLogic.h"

#include <cmath>

namespace ac {

int Percent(double done, double total) {
    if (std::isnan(total) || total < 0.1 || std::isnan(done)) {
        return 0;
    }
    const double percent = done / total * 100.0;
    // A damaged counter must not overflow the cast.
    if (percent >= 2147483647.0 || percent <= -2147483647.0) {
        return percent > 0 ? 2147483647 : -2147483647;
    }
    return static_cast<int>(percent);
}

int RipPercent(double done, double total) {
    const int percent = Percent(done, total);
    return percent >= 100 ? 0 : percent;
}

int FilledWidth(const CapacityBarState& state) {
    const long long span = state.high - state.low;
    if (span == 0) {
        return 0;
    }
    return static_cast<int>(static_cast<double>(state.position - state.low) /
                            static_cast<double>(span) * state.width);
}

std::vector<CapacityRun> CapacityBarRuns(const CapacityBarState& state) {
    const int filled = FilledWidth(state);
    const int left = state.tileOffsetX;
    if (!HasCapacityMarks(state)) {
        return {{left, filled, CapacityFill::Normal}};
    }
    auto markX = [&](long long mark) {
        return static_cast<int>(static_cast<double>(mark) / static_cast<double>(state.maxMark) *
                                state.width) +
               left;
    };
    const int nearX = markX(state.nearMark);
    const int overX = markX(state.overMark);
    if (state.position <= state.nearMark) {
        return {{left, filled, CapacityFill::Normal}};
    }
    if (state.position <= state.overMark) {
        return {{left, nearX, CapacityFill::Normal}, {nearX, filled, CapacityFill::NearOverflow}};
    }
    return {{left, nearX, CapacityFill::Normal},
            {nearX, overX, CapacityFill::NearOverflow},
            {overX, filled - 1, CapacityFill::Overflow}};
}

std::vector<int> TileStarts(int from, int to, int tileWidth) {
    std::vector<int> starts;
    if (tileWidth <= 0) {
        return starts;
    }
    for (int x = from; x < to; x += tileWidth) {
        starts.push_back(x);
    }
    return starts;
}

std::vector<ScaleTick> CapacityBarScale(const CapacityBarState& state, long long tickStep) {
    if (!HasCapacityMarks(state)) {
        return {};
    }
    return CapacityScale(state.maxMark, tickStep, state.width, state.tileOffsetX);
}

std::string RefusedFileTitle(std::string_view path) {
    const std::size_t slash = path.find_last_of("/\\");
    std::string_view name = slash == std::string_view::npos ? path : path.substr(slash + 1);
    const std::size_t dot = name.rfind('.');
    if (dot != std::string_view::npos && name.size() - dot <= 5) {
        name = name.substr(0, dot);
    }
    return std::string(name);
}

}  // namespace ac
