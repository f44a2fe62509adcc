// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/Stroke.h"

#include <algorithm>
#include <cmath>
#include <random>

#include "simulator/Panel.h"

namespace pemaro::simulator {
namespace {

constexpr size_t kPoints = 60;
constexpr uint32_t kPointMs = 8;
constexpr double kUnsteadiness = 2;  ///< pixels
constexpr size_t kComparedPoints = 64;
constexpr double kAlienDistance = 0.25;

struct Position {
    double x;
    double y;
};
using Path = std::vector<Position>;

double distance(Position a, Position b) {
    return std::hypot(a.x - b.x, a.y - b.y);
}

/// The corners of a shape within the unit square.
Path corners(int shape) {
    switch (shape) {
        case 1:
            return {{0, 0.5}, {1, 0.5}};
        case 2:
            return {{1, 0.5}, {0, 0.5}};
        case 3:
            return {{0.5, 1}, {0.5, 0}};
        case 4:
            return {{0.5, 0}, {0.5, 1}};
        case 6:
            return {{0, 0}, {0.5, 1}, {1, 0}};
        case 7:
            return {{0, 0}, {1, 0}, {0, 1}, {1, 1}};
        case 8:
            return {{0, 0}, {1, 0}, {1, 1}, {0, 1}, {0, 0}};
        default:
            break;
    }
    Path circle;
    for (int i = 0; i <= 48; ++i) {
        const double angle = 2 * M_PI * i / 48;
        circle.push_back({0.5 + 0.5 * std::sin(angle), 0.5 - 0.5 * std::cos(angle)});
    }
    return circle;
}

/// `count` points at equal distances along a path.
Path resample(const Path& path, size_t count) {
    double length = 0;
    for (size_t i = 1; i < path.size(); ++i) {
        length += distance(path[i - 1], path[i]);
    }
    Path result;
    size_t segment = 1;
    double before = 0;  // the way up to the segment
    for (size_t i = 0; i < count; ++i) {
        const double wanted = length * static_cast<double>(i) / static_cast<double>(count - 1);
        double here = distance(path[segment - 1], path[segment]);
        while (segment + 1 < path.size() && before + here < wanted) {
            before += here;
            segment += 1;
            here = distance(path[segment - 1], path[segment]);
        }
        const double part = here > 0 ? std::min((wanted - before) / here, 1.0) : 0;
        const Position from = path[segment - 1];
        const Position to = path[segment];
        result.push_back({from.x + part * (to.x - from.x), from.y + part * (to.y - from.y)});
    }
    return result;
}

struct Box {
    Position centre;
    double size;
};

Box boundsOf(const Path& path) {
    const auto byX = [](Position a, Position b) { return a.x < b.x; };
    const auto byY = [](Position a, Position b) { return a.y < b.y; };
    const auto [left, right] = std::minmax_element(path.begin(), path.end(), byX);
    const auto [top, bottom] = std::minmax_element(path.begin(), path.end(), byY);
    return {{(left->x + right->x) / 2, (top->y + bottom->y) / 2},
            std::max(right->x - left->x, bottom->y - top->y)};
}

Path pathOf(const Stroke& stroke) {
    Path path;
    for (const GesturePoint& point : stroke) {
        path.push_back({static_cast<double>(point.x), static_cast<double>(point.y)});
    }
    return path;
}

/// Moved to the centre 0 and scaled to the size 1.
Path normalize(Path path) {
    const Box box = boundsOf(path);
    for (Position& position : path) {
        position.x = (position.x - box.centre.x) / box.size;
        position.y = (position.y - box.centre.y) / box.size;
    }
    return path;
}

uint16_t onPanel(double position, int size) {
    return static_cast<uint16_t>(std::clamp<long>(std::lround(position), 0, size - 1));
}

/// A normalised path, drawn by a hand somewhere on the panel.
Stroke draw(const Path& path, uint32_t variation) {
    std::minstd_rand random(variation + 1);
    const auto between = [&random](double low, double high) {
        return std::uniform_real_distribution<double>(low, high)(random);
    };
    const double size = between(200, 600);
    const Position centre = {between(size / 2, kPanelWidth - size / 2),
                             between(size / 2, kPanelHeight - size / 2)};
    Stroke stroke;
    for (const Position& position : path) {
        GesturePoint point{};
        point.timeMs = static_cast<uint32_t>(stroke.size()) * kPointMs;
        point.x = onPanel(centre.x + size * position.x + between(-kUnsteadiness, kUnsteadiness),
                          kPanelWidth);
        point.y = onPanel(centre.y + size * position.y + between(-kUnsteadiness, kUnsteadiness),
                          kPanelHeight);
        point.pressure = static_cast<uint16_t>(between(400, 600));
        stroke.push_back(point);
    }
    return stroke;
}

}  // namespace

Stroke drawShape(int shape, uint32_t variation) {
    return draw(normalize(resample(corners(shape), kPoints)), variation);
}

Stroke drawAgain(const Stroke& stroke, uint32_t variation) {
    return draw(normalize(resample(pathOf(stroke), kPoints)), variation);
}

Stroke strokeOf(const GestureRecord& record) {
    return {record.points, record.points + std::min(record.pointCount, kGestureMaxPoints)};
}

void setStroke(const Stroke& stroke, GestureRecord* record) {
    record->pointCount = static_cast<uint32_t>(std::min<size_t>(stroke.size(), kGestureMaxPoints));
    std::copy_n(stroke.begin(), record->pointCount, record->points);
}

bool isDrawn(const Stroke& stroke) {
    return stroke.size() > 1 && boundsOf(pathOf(stroke)).size > 0;
}

double strokeSimilarity(const Stroke& a, const Stroke& b) {
    const Path first = normalize(resample(pathOf(a), kComparedPoints));
    const Path second = normalize(resample(pathOf(b), kComparedPoints));
    double sum = 0;
    for (size_t i = 0; i < kComparedPoints; ++i) {
        sum += distance(first[i], second[i]);
    }
    return 100 * std::max(0.0, 1 - sum / kComparedPoints / kAlienDistance);
}

}  // namespace pemaro::simulator
