#include "programs/reelfx/pictures/pictures.h"

#include <algorithm>
#include <cairo.h>
#include <cmath>
#include <cstring>
#include <memory>
#include <new>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

struct CairoDelete {
    void operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }
    void operator()(cairo_t* context) const { cairo_destroy(context); }
};
using SurfacePtr = std::unique_ptr<cairo_surface_t, CairoDelete>;
using ContextPtr = std::unique_ptr<cairo_t, CairoDelete>;

constexpr double kPaper = 0.11;  // dark, so that it does not outshine the pictures
constexpr double kInk = 0.87;
constexpr int kMostPixels = 32767;  // per side, the limit of the drawing library

// All lengths are proportional to the cell width, so that sheets of any size look alike.
struct Measures {
    double cellWidth, cellHeight, gap, fontSize, labelHeight, titleHeight;
    int columns, rows;

    Measures(const std::vector<GridCell>& cells, const GridOptions& options) {
        const BgraPicture& first = cells.front().picture;
        cellWidth = options.cellWidth;
        cellHeight = std::max(1.0, std::round(cellWidth * first.Height() / first.Width()));
        gap = std::round(std::max(4.0, cellWidth / 40.0));
        fontSize = std::clamp(cellWidth / 26.0, 10.0, 40.0);
        labelHeight = std::round(fontSize * 1.8);
        titleHeight = options.title.empty() ? gap : std::round(fontSize * 3.2);
        const int count = static_cast<int>(cells.size());
        columns = std::clamp(options.columns, 1, count);
        rows = (count + columns - 1) / columns;
    }

    [[nodiscard]] int Width() const { return static_cast<int>(columns * (cellWidth + gap) + gap); }
    [[nodiscard]] int Height() const {
        return static_cast<int>(titleHeight + rows * (cellHeight + labelHeight));
    }
    [[nodiscard]] double Left(std::size_t cell) const {
        return gap + static_cast<double>(cell % static_cast<std::size_t>(columns)) * (cellWidth + gap);
    }
    [[nodiscard]] double Top(std::size_t cell) const {
        return titleHeight +
               static_cast<double>(cell / static_cast<std::size_t>(columns)) * (cellHeight + labelHeight);
    }
};

void DrawText(cairo_t* context, const std::string& text, double size, double x, double baseline) {
    cairo_set_font_size(context, size);
    cairo_move_to(context, x, baseline);
    cairo_show_text(context, text.c_str());
}

void DrawPicture(cairo_t* context, const BgraPicture& picture, double x, double y, const Measures& measures) {
    // The library asks for writable memory but does not write to a source.
    auto* const bytes = const_cast<unsigned char*>(picture.Row(0));
    const SurfacePtr surface(cairo_image_surface_create_for_data(
        bytes, CAIRO_FORMAT_RGB24, picture.Width(), picture.Height(), static_cast<int>(picture.Stride())));
    cairo_save(context);
    cairo_rectangle(context, x, y, measures.cellWidth, measures.cellHeight);
    cairo_clip(context);
    cairo_translate(context, x, y);
    cairo_scale(context, measures.cellWidth / picture.Width(), measures.cellHeight / picture.Height());
    cairo_set_source_surface(context, surface.get(), 0, 0);
    cairo_pattern_set_filter(cairo_get_source(context), CAIRO_FILTER_BEST);
    cairo_pattern_set_extend(cairo_get_source(context), CAIRO_EXTEND_PAD);
    cairo_paint(context);
    cairo_restore(context);
}

}  // namespace

BgraPicture DrawGrid(const std::vector<GridCell>& cells, const GridOptions& options) {
    const Measures measures(cells, options);
    if (measures.Width() > kMostPixels || measures.Height() > kMostPixels) {
        throw UsageError("the combined picture would be " + std::to_string(measures.Width()) + "x" +
                         std::to_string(measures.Height()) + " pixels, which is too large");
    }
    BgraPicture sheet(measures.Width(), measures.Height());
    const SurfacePtr surface(cairo_image_surface_create_for_data(
        sheet.Row(0), CAIRO_FORMAT_RGB24, sheet.Width(), sheet.Height(), static_cast<int>(sheet.Stride())));
    const ContextPtr context(cairo_create(surface.get()));
    cairo_set_source_rgb(context.get(), kPaper, kPaper, kPaper);
    cairo_paint(context.get());
    cairo_set_source_rgb(context.get(), kInk, kInk, kInk);
    cairo_select_font_face(context.get(), "sans-serif", CAIRO_FONT_SLANT_NORMAL, CAIRO_FONT_WEIGHT_NORMAL);
    if (!options.title.empty()) {
        DrawText(context.get(), options.title, measures.fontSize * 1.5, measures.gap,
                 measures.titleHeight * 0.64);
    }
    for (std::size_t i = 0; i < cells.size(); ++i) {
        const double left = measures.Left(i), top = measures.Top(i);
        DrawPicture(context.get(), cells[i].picture, left, top, measures);
        DrawText(context.get(), cells[i].label, measures.fontSize, left,
                 top + measures.cellHeight + measures.fontSize * 1.2);
    }
    if (cairo_status(context.get()) != CAIRO_STATUS_SUCCESS) throw std::bad_alloc();
    cairo_surface_flush(surface.get());
    for (std::int32_t y = 0; y < sheet.Height(); ++y) {
        for (std::int32_t x = 0; x < sheet.Width(); ++x) sheet.Row(y)[x * 4 + 3] = 255;
    }
    return sheet;
}

}  // namespace velmora::hosts
