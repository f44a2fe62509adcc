// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/HandImage.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <numeric>
#include <random>

namespace pemaro::simulator {
namespace {

constexpr int kWaves = 12;
constexpr double kMean = 128;
constexpr double kDeviation = 40;

using Plane = std::array<double, kHandColumns * kHandRows>;

/// Where a wave stands in each cell of a line, as cosine and sine.
template <size_t kCells>
std::array<std::complex<double>, kCells> turns(double perCell, double phase) {
    std::array<std::complex<double>, kCells> all;
    for (size_t i = 0; i < kCells; ++i) {
        all[i] = std::polar(1.0, static_cast<double>(i) * perCell + phase);
    }
    return all;
}

/// The sum of a few waves in directions of the person's own, with mean square 1 or about.
Plane veins(uint32_t person) {
    const uint32_t seed = 2654435761u * (person + 1);
    std::minstd_rand random(seed);
    const auto upTo = [&random](double high) {
        return std::uniform_real_distribution<double>(0, high)(random);
    };
    const double amplitude = std::sqrt(2.0 / kWaves);
    Plane plane{};
    for (int wave = 0; wave < kWaves; ++wave) {
        const double direction = upTo(2 * M_PI);
        const double perCell = 0.15 + upTo(0.35);
        const double phase = upTo(2 * M_PI);
        // The sine of a sum, so that one of each column and row is enough.
        const auto columns = turns<kHandColumns>(perCell * std::cos(direction), phase);
        const auto rows = turns<kHandRows>(perCell * std::sin(direction), 0);
        for (size_t i = 0; i < plane.size(); ++i) {
            const std::complex<double>& column = columns[i % kHandColumns];
            const std::complex<double>& row = rows[i / kHandColumns];
            plane[i] += (column.imag() * row.real() + column.real() * row.imag()) * amplitude;
        }
    }
    return plane;
}

/// With mean 0 and mean square 1, nearly normal: the sum of three even ones.
double disturbance(std::minstd_rand& random) {
    constexpr double kUnit = 1.0 / std::minstd_rand::max();
    const double sum = static_cast<double>(random()) + static_cast<double>(random()) +
                       static_cast<double>(random());
    return 2 * (sum * kUnit - 1.5);
}

double meanOf(const HandImage& image) {
    return std::accumulate(image.begin(), image.end(), 0.0) / static_cast<double>(image.size());
}

}  // namespace

HandImage seeHand(uint32_t person, double noise, uint32_t variation) {
    std::minstd_rand random(variation + 1);
    const Plane plane = veins(person);
    HandImage image;
    for (size_t i = 0; i < image.size(); ++i) {
        const double seen = (1 - noise) * plane[i] + noise * disturbance(random);
        image[i] = static_cast<uint8_t>(std::clamp(kMean + kDeviation * seen, 0.0, 255.0));
    }
    return image;
}

double handSimilarity(const HandImage& a, const HandImage& b) {
    const double meanA = meanOf(a);
    const double meanB = meanOf(b);
    double squaresA = 0;
    double squaresB = 0;
    double products = 0;
    for (size_t i = 0; i < a.size(); ++i) {
        squaresA += (a[i] - meanA) * (a[i] - meanA);
        squaresB += (b[i] - meanB) * (b[i] - meanB);
        products += (a[i] - meanA) * (b[i] - meanB);
    }
    const double scale = std::sqrt(squaresA * squaresB);
    return scale > 0 ? 100 * std::max(0.0, products / scale) : 0;
}

}  // namespace pemaro::simulator
