// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace pemaro::zelkctl {

/// A place on the panel that a finger passed.
struct StrokePoint {
    int x;
    int y;
    int finger;
};

/// Where a stroke is drawn: a panel of so many pixels, in so many characters within a frame.
struct StrokeStyle {
    int width = 1;
    int height = 1;
    int columns = 18;
    int rows = 20;
    bool unicode = false;
};

/// The way of the fingers over the panel as lines for a terminal, with a frame around it. With Unicode a
/// character has eight dots, else it is a star; an O is where each finger began.
std::vector<std::string> drawStroke(const std::vector<StrokePoint>& points,
                                    const StrokeStyle& style);

}  // namespace pemaro::zelkctl
