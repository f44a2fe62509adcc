// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/FramePicture.h"

#include <png.h>

#include <algorithm>
#include <cstdint>
#include <vector>

#include "tools/zelkctl/terminal/Heat.h"

namespace pemaro::zelkctl {
namespace {

constexpr uint32_t kPositionMax = 65535;
constexpr uint8_t kMark = kHottest + 1;
constexpr int kColors = kMark + 1;

/// A picture whose pixels are levels, and one more colour for marks.
class Canvas {
  public:
    Canvas(uint32_t width, uint32_t height) : mWidth(width), mPixels(size_t{width} * height) {}

    void fill(uint32_t left, uint32_t top, uint32_t side, uint8_t level) {
        for (uint32_t y = top; y < top + side; ++y) {
            std::fill_n(&mPixels[size_t{y} * mWidth + left], side, level);
        }
    }

    void mark(int64_t x, int64_t y) {
        const auto height = static_cast<int64_t>(mPixels.size() / mWidth);
        if (x >= 0 && x < mWidth && y >= 0 && y < height) {
            mPixels[static_cast<size_t>(y * mWidth + x)] = kMark;
        }
    }

    const uint8_t* pixels() const { return mPixels.data(); }

  private:
    const uint32_t mWidth;
    std::vector<uint8_t> mPixels;
};

void drawCross(Canvas& canvas, const frames::FingerRecord& finger, uint32_t width, uint32_t height,
               unsigned scale) {
    // A finger's position goes from the middle of the first cell to the middle of the last.
    const auto along = [scale](uint16_t position, uint32_t pixels) {
        return scale / 2 + int64_t{position} * (pixels - scale) / kPositionMax;
    };
    const int64_t x = along(finger.x, width);
    const int64_t y = along(finger.y, height);
    const auto arm = static_cast<int64_t>(scale / 2);
    for (int64_t i = -arm; i <= arm; ++i) {
        canvas.mark(x + i, y);
        canvas.mark(x, y + i);
    }
}

std::string encode(const Canvas& canvas, uint32_t width, uint32_t height) {
    uint8_t palette[3 * kColors];
    for (size_t level = 0; level < kColors; ++level) {
        const Color color =
                level == kMark ? Color{255, 255, 255} : heatColor(static_cast<uint8_t>(level));
        palette[3 * level] = color.red;
        palette[3 * level + 1] = color.green;
        palette[3 * level + 2] = color.blue;
    }
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = width;
    image.height = height;
    image.format = PNG_FORMAT_RGB_COLORMAP;
    image.colormap_entries = kColors;
    png_alloc_size_t size = PNG_IMAGE_PNG_SIZE_MAX(image);
    std::string png(size, '\0');
    if (png_image_write_to_memory(&image, &png[0], &size, 0, canvas.pixels(),
                                  static_cast<png_int_32>(width), palette) == 0) {
        return "";
    }
    png.resize(size);
    return png;
}

}  // namespace

std::string drawFrame(const frames::FrameContent& frame, const PictureStyle& style) {
    if (frame.image.empty()) {
        return "";
    }
    const uint32_t width = frame.header.columns * style.scale;
    const uint32_t height = frame.header.rows * style.scale;
    Canvas canvas(width, height);
    for (uint32_t row = 0; row < frame.header.rows; ++row) {
        for (uint32_t column = 0; column < frame.header.columns; ++column) {
            const int value = frame.image[size_t{row} * frame.header.columns + column];
            canvas.fill(column * style.scale, row * style.scale, style.scale,
                        heatLevel(value, style.full));
        }
    }
    for (const frames::FingerRecord& finger : frame.fingers) {
        drawCross(canvas, finger, width, height, style.scale);
    }
    return encode(canvas, width, height);
}

}  // namespace pemaro::zelkctl
