#include "media/quality/EModel.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace
{
constexpr double BASE = 93.2; // R of the default values
constexpr double BEST = 95;   // beyond which equipment cannot impair

struct Equipment
{
    MG_Rtp::ECodec::Type codec;
    double impairment; // Ie
    double robustness; // Bpl, in percent of loss
};
// ITU-T G.113, appendix I, tables I.1 to I.4: G.711 with concealment, G.729A with VAD, G.723.1 at 6.3 kbit/s
constexpr Equipment EQUIPMENT[] = {{MG_Rtp::ECodec::PCMA, 0, 25.1},
                                   {MG_Rtp::ECodec::PCMU, 0, 25.1},
                                   {MG_Rtp::ECodec::G729, 11, 19.0},
                                   {MG_Rtp::ECodec::G723, 15, 16.1}};

/// Idd of G.107, 7.4.
double DELAY_IMPAIRMENT(double delay)
{
    if (delay <= 100)
        return 0;
    double const x = std::log2(delay / 100);
    return 25 * (std::pow(1 + std::pow(x, 6), 1.0 / 6) - 3 * std::pow(1 + std::pow(x / 3, 6), 1.0 / 6) + 2);
}
} // namespace

double EModel::SCORE_OF_RATING(double rating)
{
    if (rating <= 0)
        return 1;
    if (rating >= 100)
        return 4.5;
    return std::max(1 + 0.035 * rating + rating * (rating - 60) * (100 - rating) * 7e-6, 1.0);
}

std::optional<unsigned int> EModel::SCORE(MG_Rtp::ECodec::Type codec, double lossPercent, double delay)
{
    auto const found = std::find_if(std::begin(EQUIPMENT), std::end(EQUIPMENT),
                                    [codec](Equipment const& one) { return one.codec == codec; });
    if (found == std::end(EQUIPMENT))
        return std::nullopt;
    double const equipment =
        found->impairment + (BEST - found->impairment) * lossPercent / (lossPercent + found->robustness);
    double const rating = BASE - DELAY_IMPAIRMENT(delay) - equipment;
    return static_cast<unsigned int>(std::lround(100 * SCORE_OF_RATING(rating)));
}
