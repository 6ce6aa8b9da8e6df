#include "bench.h"

#include <Engine/Base/path.h>

#include <QPainterPath>

#include <cairo.h>

#include <memory>
#include <utility>
#include <vector>

using namespace tarn::engine;

namespace {

constexpr int kShapes = 1000;
constexpr int kLines = 100000;

struct CairoPath {
    CairoPath() {
        surface = cairo_image_surface_create(CAIRO_FORMAT_A8, 1, 1);
        context = cairo_create(surface);
    }
    CairoPath(CairoPath const&) = delete;
    CairoPath& operator=(CairoPath const&) = delete;
    ~CairoPath() {
        for (cairo_path_t* path : kept) cairo_path_destroy(path);
        cairo_destroy(context);
        cairo_surface_destroy(surface);
    }
    void keep() {
        kept.push_back(cairo_copy_path(context));
        cairo_new_path(context);
    }
    cairo_surface_t* surface;
    cairo_t* context;
    std::vector<cairo_path_t*> kept;
};

// The same outline for cairo, which has no rounded rectangles.
void roundRect(cairo_t* c, double x, double y, double w, double h, double r) {
    double const k = r * 0.552284749;
    cairo_move_to(c, x + r, y);
    cairo_line_to(c, x + w - r, y);
    cairo_curve_to(c, x + w - r + k, y, x + w, y + r - k, x + w, y + r);
    cairo_line_to(c, x + w, y + h - r);
    cairo_curve_to(c, x + w, y + h - r + k, x + w - r + k, y + h, x + w - r, y + h);
    cairo_line_to(c, x + r, y + h);
    cairo_curve_to(c, x + r - k, y + h, x, y + h - r + k, x, y + h - r);
    cairo_line_to(c, x, y + r);
    cairo_curve_to(c, x, y + r - k, x + r - k, y, x + r, y);
    cairo_close_path(c);
}

Path ourLines() {
    PathBuilder builder;
    builder.moveTo({0, 0});
    for (int i = 1; i < kLines; ++i) {
        double const d = i;
        builder.lineTo({d, d * 0.5});
    }
    return std::move(builder).build();
}

QPainterPath qtLines() {
    QPainterPath path;
    path.moveTo(0, 0);
    for (int i = 1; i < kLines; ++i) path.lineTo(i, i * 0.5);
    return path;
}

std::unique_ptr<CairoPath> cairoLines() {
    auto path = std::make_unique<CairoPath>();
    cairo_move_to(path->context, 0, 0);
    for (int i = 1; i < kLines; ++i) cairo_line_to(path->context, i, i * 0.5);
    return path;
}

void checkAgreement() {
    Path const ours = PathBuilder().roundRect({1, 2}, {30, 40}, 5).build();
    QPainterPath qt;
    qt.addRoundedRect(1, 2, 30, 40, 5, 5);
    CairoPath cairo;
    roundRect(cairo.context, 1, 2, 30, 40, 5);
    double x1 = 0, y1 = 0, x2 = 0, y2 = 0;
    cairo_path_extents(cairo.context, &x1, &y1, &x2, &y2);
    bench::agree(qt.boundingRect() == QRectF(1, 2, 30, 40) && x1 == 1 && y1 == 2 && x2 == 31 &&
                     y2 == 42 && ours.elements[1].points[0] == FloatVec2{26, 2},
                 "rounded rectangles");
    Path const lines = ourLines();
    bench::agree(lines.elements.size() == kLines && qtLines().elementCount() == kLines,
                 "polylines");
}

std::shared_ptr<CairoPath> newCairoPath() { return std::make_shared<CairoPath>(); }

void shapes() {
    using Cairo = std::shared_ptr<CairoPath>;
    bench::operation("1,000 rounded rectangles, a path each")
        .ours(bench::doing([] {
            std::vector<Path> list;
            for (int i = 0; i < kShapes; ++i) {
                PathBuilder builder;
                builder.roundRect({double(i), 2}, {30, 40}, 5);
                list.push_back(std::move(builder).build());
            }
            return list;
        }))
        .peer("QPainterPath", bench::doing([] {
                  std::vector<QPainterPath> list;
                  for (int i = 0; i < kShapes; ++i) {
                      QPainterPath path;
                      path.addRoundedRect(i, 2, 30, 40, 5, 5);
                      list.push_back(path);
                  }
                  return list;
              }))
        .peer("cairo", bench::onEach(newCairoPath,
                                     [](Cairo& cairo) {
                                         for (int i = 0; i < kShapes; ++i) {
                                             roundRect(cairo->context, i, 2, 30, 40, 5);
                                             cairo->keep();
                                         }
                                         return cairo;
                                     }))
        .atMost(0.8);
    bench::operation("1,000 rounded rectangles in one path")
        .ours(bench::doing([] {
            PathBuilder builder;
            for (int i = 0; i < kShapes; ++i) builder.roundRect({double(i), 2}, {30, 40}, 5);
            return std::move(builder).build();
        }))
        .peer("QPainterPath", bench::doing([] {
                  QPainterPath path;
                  for (int i = 0; i < kShapes; ++i) path.addRoundedRect(i, 2, 30, 40, 5, 5);
                  return path;
              }))
        .peer("cairo", bench::onEach(newCairoPath,
                                     [](Cairo& cairo) {
                                         for (int i = 0; i < kShapes; ++i)
                                             roundRect(cairo->context, i, 2, 30, 40, 5);
                                         return cairo;
                                     }))
        .atMost(0.8);
}

void polylines() {
    bench::operation("build a polyline of 100,000")
        .ours(bench::doing(ourLines))
        .peer("QPainterPath", bench::doing(qtLines))
        .peer("cairo", bench::doing(cairoLines))
        .atMost(1.2)
        .quick();
    bench::operation("copy a polyline of 100,000")
        .ours(bench::on(ourLines, [](Path const& path) { return path; }))
        .peer("QPainterPath detached", bench::on(qtLines,
                                                 [](QPainterPath const& path) {
                                                     QPainterPath result = path;
                                                     result.setElementPositionAt(0, 0, 0);
                                                     return result;
                                                 }))
        .atMost(4.0)
        .quick();
    auto const equal = [](auto const& both) { return both.first == both.second; };
    bench::operation("== of polylines of 100,000")
        .ours(bench::on([] { return std::pair(ourLines(), ourLines()); }, equal))
        .peer("QPainterPath", bench::on([] { return std::pair(qtLines(), qtLines()); }, equal))
        .atMost(1.7);
    bench::operation("destroy a polyline of 100,000")
        .ours(bench::onEach([] { return std::make_unique<Path>(ourLines()); },
                            [](std::unique_ptr<Path>& path) {
                                path.reset();
                                return 0;
                            }))
        .peer("a tenth of QPainterPath's build", bench::doing([] {
                  QPainterPath path;
                  path.moveTo(0, 0);
                  for (int i = 1; i < kLines / 10; ++i) path.lineTo(i, i * 0.5);
                  return path;
              }))
        .atMost(1.0);
}

}  // namespace

void bench::paths() {
    agreement(checkAgreement);
    shapes();
    polylines();
}
