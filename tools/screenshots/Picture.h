#pragma once

#include <Ecore_Evas.h>
#include <cairo.h>

#include <cstdio>
#include <string>

#include "support/Screen.h"

namespace ui {

// Writes what a window on the buffer engine shows, once everything has come to rest, and tells so.
inline void savePicture(Evas_Object* window, const std::string& file)
{
    support::runFor(0.3);
    support::settle(window);
    elm_win_render(window);
    Evas* canvas = evas_object_evas_get(window);
    int width = 0;
    int height = 0;
    evas_output_size_get(canvas, &width, &height);
    const auto* pixels
        = static_cast<const unsigned char*>(ecore_evas_buffer_pixels_get(ecore_evas_ecore_evas_get(canvas)));
    cairo_surface_t* surface = cairo_image_surface_create_for_data(
        const_cast<unsigned char*>(pixels), CAIRO_FORMAT_RGB24, width, height, width * 4);
    const bool saved = cairo_surface_write_to_png(surface, file.c_str()) == CAIRO_STATUS_SUCCESS;
    cairo_surface_destroy(surface);
    std::printf("%s %s\n", saved ? "wrote" : "failed", file.c_str());
}

}
