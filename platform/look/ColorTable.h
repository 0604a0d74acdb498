#pragma once

#include <map>
#include <optional>
#include <string>

namespace look {

// 0 to 255 each, not premultiplied.
struct Color {
    int red = 255;
    int green = 255;
    int blue = 255;
    int alpha = 255;
};

// A colour of a table: what it is in the light and in the dark theme.
struct ThemeColor {
    Color light;
    Color dark;
    [[nodiscard]] const Color& of(bool isDark) const { return isDark ? dark : light; }
};

using Colors = std::map<std::string, ThemeColor>;

// "#RRGGBB" or "#RRGGBBAA".
std::optional<Color> parseColor(const std::string& text);
// Reads <color code="" light="" dark=""/> elements. Empty when the file is missing, no XML, or has a wrong colour.
std::optional<Colors> readColorTable(const std::string& path);

struct Font {
    std::string family;
    int size = 0; // design units; negative: percent of the size in the layout
};
using Fonts = std::map<std::string, Font>;
// Reads <font class="" family="" size=""/> elements.
std::optional<Fonts> readFontTable(const std::string& path);

}
