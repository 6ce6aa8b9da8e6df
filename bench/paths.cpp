#include "bench.h"

#include <Engine/Base/path.h>

#include <QPainterPath>

#include <cairo.h>

#include <memory>
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

// The same outline for cairo, which has no rounded rectangle of its own.
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

}  // namespace

void bench::paths() {
    auto const nothing = [] { return 0; };
    {
        Path const ours = PathBuilder().roundRect({1, 2}, {30, 40}, 5).build();
        QPainterPath qt;
        qt.addRoundedRect(1, 2, 30, 40, 5, 5);
        CairoPath cairo;
        roundRect(cairo.context, 1, 2, 30, 40, 5);
        double x1 = 0, y1 = 0, x2 = 0, y2 = 0;
        cairo_path_extents(cairo.context, &x1, &y1, &x2, &y2);
        agree(qt.boundingRect() == QRectF(1, 2, 30, 40) && x1 == 1 && y1 == 2 && x2 == 31 &&
                  y2 == 42 && ours.elements[1].points[0] == FloatVec2{26, 2},
              "rounded rectangles");
        Path const lines = ourLines();
        agree(lines.elements.size() == kLines && qtLines().elementCount() == kLines, "polylines");
    }

    std::string const own = "1,000 rounded rectangles, a path each";
    measure(own, "ours", nothing, [](int) {
        std::vector<Path> list;
        for (int i = 0; i < kShapes; ++i) {
            PathBuilder builder;
            builder.roundRect({double(i), 2}, {30, 40}, 5);
            list.push_back(std::move(builder).build());
        }
        return list;
    });
    measure(own, "QPainterPath", nothing, [](int) {
        std::vector<QPainterPath> list;
        for (int i = 0; i < kShapes; ++i) {
            QPainterPath path;
            path.addRoundedRect(i, 2, 30, 40, 5, 5);
            list.push_back(path);
        }
        return list;
    });
    measure(
        own, "cairo", [] { return std::make_shared<CairoPath>(); },
        [](std::shared_ptr<CairoPath>& cairo) {
            for (int i = 0; i < kShapes; ++i) {
                roundRect(cairo->context, i, 2, 30, 40, 5);
                cairo->keep();
            }
            return cairo;
        });
    target(own, 0.8);

    std::string const one = "1,000 rounded rectangles in one path";
    measure(one, "ours", nothing, [](int) {
        PathBuilder builder;
        for (int i = 0; i < kShapes; ++i) builder.roundRect({double(i), 2}, {30, 40}, 5);
        return std::move(builder).build();
    });
    measure(one, "QPainterPath", nothing, [](int) {
        QPainterPath path;
        for (int i = 0; i < kShapes; ++i) path.addRoundedRect(i, 2, 30, 40, 5, 5);
        return path;
    });
    measure(
        one, "cairo", [] { return std::make_shared<CairoPath>(); },
        [](std::shared_ptr<CairoPath>& cairo) {
            for (int i = 0; i < kShapes; ++i) roundRect(cairo->context, i, 2, 30, 40, 5);
            return cairo;
        });
    target(one, 0.8);

    std::string const lines = "a polyline of 100,000";
    measure(lines, "ours", nothing, [](int) { return ourLines(); });
    measure(lines, "QPainterPath", nothing, [](int) { return qtLines(); });
    measure(lines, "cairo", nothing, [](int) { return cairoLines(); });
    target(lines, 0.5);

    static Path const ours = ourLines();
    static Path const twin = ourLines();
    static QPainterPath const qt = qtLines();
    static QPainterPath const qtTwin = qtLines();
    std::string const copy = "copy a polyline of 100,000";
    measureOn(copy, "ours", ours, [](Path const& p) { return p; });
    measureOn(copy, "QPainterPath detached", qt, [](QPainterPath const& p) {
        QPainterPath result = p;
        result.setElementPositionAt(0, 0, 0);
        return result;
    });
    target(copy, 3.0, "QPainterPath detached");
    std::string const equal = "== of polylines of 100,000";
    measureOn(equal, "ours", ours, [](Path const& p) { return p == twin; });
    measureOn(equal, "QPainterPath", qt, [](QPainterPath const& p) { return p == qtTwin; });
    target(equal, 1.5, "QPainterPath");
    std::string const destroy = "destroy a polyline of 100,000";
    measure(
        destroy, "ours", [] { return std::make_unique<Path>(ours); },
        [](std::unique_ptr<Path>& p) {
            p.reset();
            return 0;
        });
    measure(destroy, "a tenth of QPainterPath's build", nothing, [](int) {
        QPainterPath path;
        path.moveTo(0, 0);
        for (int i = 1; i < kLines / 10; ++i) path.lineTo(i, i * 0.5);
        return path;
    });
    target(destroy, 1.0, "a tenth of QPainterPath's build");
}
