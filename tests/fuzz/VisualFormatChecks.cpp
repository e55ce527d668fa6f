#include "tests/fuzz/VisualFormatChecks.h"

#include "platform/system/Syslog.h"
#include "platform/views/ConstraintSolver.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "tests/support/TestPlatform.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace nimbra::test {

namespace {

/// Three views in a fourth, with a constraint of each kind of content.
struct Scene {
    std::shared_ptr<View> root;
    std::shared_ptr<View> bar;
    std::shared_ptr<Label> label;
    std::shared_ptr<View> box;

    explicit Scene(const PlatformServices& services)
        : root(std::make_shared<View>(services, Rect{})),
          bar(std::make_shared<ProgressView>(services, ProgressViewStyle::standard)),
          label(std::make_shared<Label>(services, Rect{})),
          box(std::make_shared<View>(services, Rect{{1, 2}, {3, 4}})) {
        root->addSubview(bar);
        root->addSubview(label);
        root->addSubview(box);
        bar->setTranslatesAutoresizingMaskIntoConstraints(false);
        label->setTranslatesAutoresizingMaskIntoConstraints(false);
        label->setText("as many lines as it takes");
        label->setNumberOfLines(0);
    }

    [[nodiscard]] std::expected<std::vector<LayoutConstraint>, Error>
    constraintsOf(std::string_view format) const {
        return LayoutConstraint::constraintsWithVisualFormat(
            format, {.metrics = {{"margin", 50},
                                 {"low", 250},
                                 {"wrong", std::numeric_limits<double>::quiet_NaN()}},
                     .views = {{"bar", bar.get()}, {"label", label.get()}, {"box", box.get()}}});
    }
};

std::string faultIn(const Error& error, std::size_t length) {
    if (error.code < 1 || static_cast<std::size_t>(error.code) > length + 1) {
        return "the error's column lies outside the format";
    }
    const std::string begin = "column " + std::to_string(error.code) + ": ";
    if (!error.description.starts_with(begin) || !error.description.ends_with(" was expected")) {
        return "the error does not say what was expected where";
    }
    return "";
}

std::string faultIn(const Rect& frame) {
    for (const double value :
         {frame.origin.x, frame.origin.y, frame.size.width, frame.size.height}) {
        if (!std::isfinite(value)) {
            return "a frame is not finite";
        }
    }
    return frame.size.width < 0 || frame.size.height < 0 ? "a size is negative" : "";
}

/// An edge or an extent of a view in the coordinates of `root`'s subviews.
double valueOf(const View* view, LayoutAttribute attribute, const View& root) {
    if (view == nullptr) {
        return 0;
    }
    const Size size = view->frame().size;
    const Point origin = view == &root ? Point{} : view->frame().origin;
    switch (attribute) {
    case LayoutAttribute::left:
        return origin.x;
    case LayoutAttribute::right:
        return origin.x + size.width;
    case LayoutAttribute::top:
        return origin.y;
    case LayoutAttribute::bottom:
        return origin.y + size.height;
    case LayoutAttribute::width:
        return size.width;
    case LayoutAttribute::height:
        return size.height;
    case LayoutAttribute::none:
        break;
    }
    return 0;
}

bool holds(const LayoutConstraint& rule, const View& root) {
    constexpr double tolerance = 1e-3;
    const double excess = valueOf(rule.firstItem, rule.firstAttribute, root) -
                          valueOf(rule.secondItem, rule.secondAttribute, root) - rule.constant;
    return (excess <= tolerance || rule.relation == LayoutRelation::greaterThanOrEqual) &&
           (excess >= -tolerance || rule.relation == LayoutRelation::lessThanOrEqual);
}

/// Whether as many required constraints hold as the solver says.
bool isSolvedAsSaid(const View& root) {
    const auto broken = std::ranges::count_if(root.constraints(), [&](const auto& rule) {
        return rule.priority >= requiredLayoutPriority && !holds(rule, root);
    });
    return static_cast<std::size_t>(broken) == ConstraintSolver(root).broken().size();
}

TestPlatform& platform() {
    static TestPlatform platform;
    return platform;
}

} // namespace

std::string faultInVisualFormat(std::string_view format) {
    const Scene scene(platform().services());
    auto constraints = scene.constraintsOf(format);
    if (!constraints) {
        return faultIn(constraints.error(), format.size());
    }
    if (constraints->empty() && format.find('[') == std::string_view::npos) {
        return "a format without a view is good";
    }
    scene.root->addConstraints(std::move(*constraints));
    auto before = replaceSyslogSink([](int /*priority*/, const std::string& /*message*/) {});
    std::string fault;
    for (const Size& size : {Size{320, 200}, Size{60, 12.5}, Size{}}) {
        scene.root->setFrame({{7, 7}, size});
        scene.root->setNeedsLayout();
        scene.root->layoutIfNeeded();
        for (const std::shared_ptr<View>& view : scene.root->subviews()) {
            if (auto found = faultIn(view->frame()); !found.empty()) {
                fault = std::move(found);
            }
        }
        if (!isSolvedAsSaid(*scene.root)) {
            fault = "other required constraints are broken than the solver says";
        }
        if (scene.box->frame() != Rect{{1, 2}, {3, 4}}) {
            fault = "a view that stands as it is has moved";
        }
    }
    replaceSyslogSink(std::move(before));
    return fault;
}

bool isVisualFormat(std::string_view format) {
    return Scene(platform().services()).constraintsOf(format).has_value();
}

} // namespace nimbra::test
