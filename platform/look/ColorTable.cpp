#include "ColorTable.h"

#include <charconv>
#include <functional>
#include <memory>

#include <dlog.h>
#include <glib.h>

namespace look {

namespace {

    using Attributes = std::map<std::string, std::string>;
    // Answers what is wrong with an element, empty when nothing is.
    using ElementHandler = std::function<std::string(const std::string& element, const Attributes& attributes)>;

    void startElement(GMarkupParseContext*, const gchar* element, const gchar** names, const gchar** values,
        gpointer data, GError** error)
    {
        Attributes attributes;
        for (int i = 0; names[i]; ++i)
            attributes[names[i]] = values[i];
        const std::string problem = (*static_cast<ElementHandler*>(data))(element, attributes);
        if (!problem.empty())
            g_set_error_literal(error, G_MARKUP_ERROR, G_MARKUP_ERROR_INVALID_CONTENT, problem.c_str());
    }

    bool parse(const std::string& path, ElementHandler handler)
    {
        gchar* text = nullptr;
        gsize length = 0;
        GError* error = nullptr;
        const GMarkupParser parser = {startElement, nullptr, nullptr, nullptr, nullptr};
        const std::unique_ptr<GMarkupParseContext, decltype(&g_markup_parse_context_free)> context(
            g_markup_parse_context_new(&parser, static_cast<GMarkupParseFlags>(0), &handler, nullptr),
            g_markup_parse_context_free);
        const bool done = g_file_get_contents(path.c_str(), &text, &length, &error)
            && g_markup_parse_context_parse(context.get(), text, static_cast<gssize>(length), &error)
            && g_markup_parse_context_end_parse(context.get(), &error);
        if (error)
            __dlog_print(LOG_ID_MAIN, DLOG_ERROR, "LOOK", "%s: %s", path.c_str(), error->message);
        g_clear_error(&error);
        g_free(text);
        return done;
    }

    std::string attribute(const Attributes& attributes, const std::string& name)
    {
        const auto found = attributes.find(name);
        return found == attributes.end() ? std::string() : found->second;
    }

    std::optional<int> hexByte(const std::string& text, size_t position)
    {
        int value = 0;
        const char* begin = text.data() + position;
        const auto [end, error] = std::from_chars(begin, begin + 2, value, 16);
        if (error != std::errc() || end != begin + 2 || value < 0)
            return std::nullopt;
        return value;
    }

}

std::optional<Color> parseColor(const std::string& text)
{
    if ((text.size() != 7 && text.size() != 9) || text[0] != '#')
        return std::nullopt;
    const auto red = hexByte(text, 1);
    const auto green = hexByte(text, 3);
    const auto blue = hexByte(text, 5);
    const auto alpha = text.size() == 9 ? hexByte(text, 7) : 255;
    if (!red || !green || !blue || !alpha)
        return std::nullopt;
    return Color{*red, *green, *blue, *alpha};
}

std::optional<Colors> readColorTable(const std::string& path)
{
    Colors colors;
    const auto read = [&colors](const std::string& element, const Attributes& attributes) -> std::string {
        if (element != "color")
            return {};
        const std::string code = attribute(attributes, "code");
        const auto light = parseColor(attribute(attributes, "light"));
        const auto dark = parseColor(attribute(attributes, "dark"));
        if (code.empty() || !light || !dark)
            return "wrong colour \"" + code + "\"";
        colors[code] = {*light, *dark};
        return {};
    };
    return parse(path, read) ? std::optional(colors) : std::nullopt;
}

std::optional<Fonts> readFontTable(const std::string& path)
{
    Fonts fonts;
    const auto read = [&fonts](const std::string& element, const Attributes& attributes) -> std::string {
        if (element != "font")
            return {};
        const std::string name = attribute(attributes, "class");
        const std::string size = attribute(attributes, "size");
        Font font{attribute(attributes, "family"), 0};
        const auto result = std::from_chars(size.data(), size.data() + size.size(), font.size);
        if (name.empty() || font.family.empty() || result.ec != std::errc())
            return "wrong font \"" + name + "\"";
        fonts[name] = font;
        return {};
    };
    return parse(path, read) ? std::optional(fonts) : std::nullopt;
}

}
