#include "tools/outputs/picture/Style.h"

namespace tools {
namespace {

constexpr Palette kLight = {
    .background = rgb(0xFFFFFF),
    .ink = rgb(0x222222),
    .pale = rgb(0x6B6B6B),
    .frame = rgb(0xB8B8B8),
    .grid = rgb(0xE9E9E9),
    .samples = rgb(0x1F5A94),
    .marker = rgb(0x00796B),
    .trigger = rgb(0xC2410C),
    .wait = rgb(0xEDEDED),
    .waitHatch = rgb(0xBDBDBD),
    .waveforms = {rgb(0x9CC3E6), rgb(0xF7C48F), rgb(0xA9D8A4), rgb(0xD9B8E3), rgb(0xF3AFAF), rgb(0xD5CE86),
                  rgb(0xA0D9D4), rgb(0xD6BCA4)},
};

constexpr Palette kDark = {
    .background = rgb(0x15181D),
    .ink = rgb(0xECECEC),
    .pale = rgb(0xA4ABB5),
    .frame = rgb(0x59616C),
    .grid = rgb(0x2B3038),
    .samples = rgb(0x6CB6FF),
    .marker = rgb(0x4DC4B5),
    .trigger = rgb(0xFF8F5E),
    .wait = rgb(0x2D323A),
    .waitHatch = rgb(0x59616C),
    .waveforms = {rgb(0x2B5A85), rgb(0x855722), rgb(0x37693A), rgb(0x664879), rgb(0x853F40), rgb(0x66601F),
                  rgb(0x2A6A66), rgb(0x6B4F38)},
};

}  // namespace

const Palette& paletteOf(PictureStyle style) { return style == PictureStyle::kDark ? kDark : kLight; }

}  // namespace tools
