#include "platform/views/ConstraintSolver.h"

#include "platform/views/LinearSystem.h"
#include "platform/views/View.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>
#include <sstream>
#include <string_view>
#include <utility>

namespace nimbra {

namespace {

using Term = LinearSystem::Term;

struct Span {
    double start = 0;
    double extent = 0;
};

Span spanOf(const Rect& rect, LayoutAxis axis) {
    return axis == LayoutAxis::horizontal
               ? Span{.start = rect.origin.x, .extent = rect.size.width}
               : Span{.start = rect.origin.y, .extent = rect.size.height};
}

double finiteOrZero(double value) {
    return std::isfinite(value) ? value : 0;
}

std::string_view nameOf(LayoutAttribute attribute) {
    switch (attribute) {
    case LayoutAttribute::left:
        return "left";
    case LayoutAttribute::right:
        return "right";
    case LayoutAttribute::top:
        return "top";
    case LayoutAttribute::bottom:
        return "bottom";
    case LayoutAttribute::width:
        return "width";
    case LayoutAttribute::height:
        return "height";
    case LayoutAttribute::none:
        break;
    }
    return "";
}

std::string_view signOf(LayoutRelation relation) {
    switch (relation) {
    case LayoutRelation::lessThanOrEqual:
        return " <= ";
    case LayoutRelation::greaterThanOrEqual:
        return " >= ";
    case LayoutRelation::equal:
        break;
    }
    return " == ";
}

/// One of the two directions of a layout.
class AxisLayout {
public:
    AxisLayout(const View& container, LayoutAxis axis) : _container(container), _axis(axis) {
        addRulesOfConstraints();
    }

    /// Lets the constraints place `view`, whose content asks for `contentExtent` if it is not
    /// negative.
    void place(const std::shared_ptr<View>& view, double contentExtent);

    /// Solves for all views that were given. Adds what required rules are broken.
    void solve(std::vector<std::string>& broken);

    [[nodiscard]] Span spanOfPlaced(std::size_t index) const;

private:
    struct Rule {
        const View* firstItem;
        LayoutAttribute firstAttribute;
        LayoutRelation relation;
        const View* secondItem;
        LayoutAttribute secondAttribute;
        double constant;
    };
    struct Placed {
        const View* view;
        std::size_t start;
        std::size_t extent;
    };
    struct Sum {
        std::vector<Term> terms;
        double constant = 0;

        void add(const Placed& placed, LayoutAttribute attribute, double factor);
        void add(const Span& span, LayoutAttribute attribute, double factor);
    };

    void addRulesOfConstraints();
    void addTo(Sum& sum, const View* item, LayoutAttribute attribute, double factor) const;
    [[nodiscard]] bool isHeld(const Rule& rule);
    [[nodiscard]] std::string itemInWords(const View* item) const;
    [[nodiscard]] std::string inWords(const Rule& rule) const;

    const View& _container;
    LayoutAxis _axis;
    LinearSystem _system;
    std::vector<Placed> _placed;
    /// By falling priority; rules of the same one in the order in which they came.
    std::multimap<LayoutPriority, Rule, std::greater<>> _rules;
};

bool measuresExtent(LayoutAttribute attribute) {
    return attribute == LayoutAttribute::width || attribute == LayoutAttribute::height;
}

bool isFarEdge(LayoutAttribute attribute) {
    return attribute == LayoutAttribute::right || attribute == LayoutAttribute::bottom;
}

void AxisLayout::Sum::add(const Placed& placed, LayoutAttribute attribute, double factor) {
    if (!measuresExtent(attribute)) {
        terms.push_back({.variable = placed.start, .factor = factor});
    }
    if (measuresExtent(attribute) || isFarEdge(attribute)) {
        terms.push_back({.variable = placed.extent, .factor = factor});
    }
}

void AxisLayout::Sum::add(const Span& span, LayoutAttribute attribute, double factor) {
    if (!measuresExtent(attribute)) {
        constant += factor * span.start;
    }
    if (measuresExtent(attribute) || isFarEdge(attribute)) {
        constant += factor * span.extent;
    }
}

void AxisLayout::addRulesOfConstraints() {
    for (const LayoutConstraint& constraint : _container.constraints()) {
        if (isHorizontal(constraint.firstAttribute) == (_axis == LayoutAxis::horizontal)) {
            _rules.emplace(constraint.priority, Rule{.firstItem = constraint.firstItem,
                                                     .firstAttribute = constraint.firstAttribute,
                                                     .relation = constraint.relation,
                                                     .secondItem = constraint.secondItem,
                                                     .secondAttribute = constraint.secondAttribute,
                                                     .constant = constraint.constant});
        }
    }
}

void AxisLayout::place(const std::shared_ptr<View>& view, double contentExtent) {
    const Placed placed{.view = view.get(),
                        .start = _system.addVariable(LinearSystem::Range::any),
                        .extent = _system.addVariable(LinearSystem::Range::notNegative)};
    _placed.push_back(placed);
    if (!std::isfinite(contentExtent) || contentExtent < 0) {
        return;
    }
    Rule rule{.firstItem = placed.view,
              .firstAttribute = _axis == LayoutAxis::horizontal ? LayoutAttribute::width
                                                                : LayoutAttribute::height,
              .relation = LayoutRelation::greaterThanOrEqual,
              .secondItem = nullptr,
              .secondAttribute = LayoutAttribute::none,
              .constant = contentExtent};
    _rules.emplace(view->contentCompressionResistancePriorityForAxis(_axis), rule);
    rule.relation = LayoutRelation::lessThanOrEqual;
    _rules.emplace(lowLayoutPriority, rule);
}

void AxisLayout::solve(std::vector<std::string>& broken) {
    for (const auto& [priority, rule] : _rules) {
        if (!isHeld(rule) && priority >= requiredLayoutPriority) {
            broken.push_back(inWords(rule));
        }
    }
    // What nothing has been said of.
    for (const Placed& placed : _placed) {
        _system.demand({{.variable = placed.extent, .factor = 1}}, LayoutRelation::equal, 0);
    }
    for (const Placed& placed : _placed) {
        _system.demand({{.variable = placed.start, .factor = 1}}, LayoutRelation::equal, 0);
    }
}

bool AxisLayout::isHeld(const Rule& rule) {
    Sum sum;
    addTo(sum, rule.firstItem, rule.firstAttribute, 1);
    if (rule.secondItem != nullptr) {
        addTo(sum, rule.secondItem, rule.secondAttribute, -1);
    }
    return _system.demand(sum.terms, rule.relation, rule.constant - sum.constant);
}

void AxisLayout::addTo(Sum& sum, const View* item, LayoutAttribute attribute, double factor) const {
    const auto placed = std::ranges::find(_placed, item, &Placed::view);
    if (placed != _placed.end()) {
        sum.add(*placed, attribute, factor);
        return;
    }
    Span span = spanOf(item->frame(), _axis);
    if (item == &_container) {
        span.start = 0;
    }
    sum.add(
        Span{.start = finiteOrZero(span.start), .extent = std::max(0.0, finiteOrZero(span.extent))},
        attribute, factor);
}

Span AxisLayout::spanOfPlaced(std::size_t index) const {
    const Placed& placed = _placed.at(index);
    return {.start = _system.valueOf(placed.start),
            .extent = std::max(0.0, _system.valueOf(placed.extent))};
}

std::string AxisLayout::itemInWords(const View* item) const {
    const auto& subviews = _container.subviews();
    const auto found = std::ranges::find(subviews, item, &std::shared_ptr<View>::get);
    return found == subviews.end() ? "the view's "
                                   : "subview " + std::to_string(found - subviews.begin()) + "'s ";
}

std::string AxisLayout::inWords(const Rule& rule) const {
    std::ostringstream words;
    words << itemInWords(rule.firstItem) << nameOf(rule.firstAttribute) << signOf(rule.relation);
    if (rule.secondItem != nullptr) {
        words << itemInWords(rule.secondItem) << nameOf(rule.secondAttribute)
              << (rule.constant < 0 ? " - " : " + ") << std::abs(rule.constant);
    } else {
        words << rule.constant;
    }
    return words.str();
}

} // namespace

ConstraintSolver::ConstraintSolver(const View& container) {
    for (const std::shared_ptr<View>& view : container.subviews()) {
        if (!view->translatesAutoresizingMaskIntoConstraints()) {
            _placements.push_back({.view = view, .frame = {}});
        }
    }
    if (_placements.empty()) {
        return;
    }
    AxisLayout across(container, LayoutAxis::horizontal);
    for (const Placement& placement : _placements) {
        across.place(placement.view, placement.view->intrinsicContentSize().width);
    }
    across.solve(_broken);
    AxisLayout down(container, LayoutAxis::vertical);
    for (std::size_t index = 0; index < _placements.size(); ++index) {
        Placement& placement = _placements[index];
        const auto [start, extent] = across.spanOfPlaced(index);
        placement.frame.origin.x = start;
        placement.frame.size.width = extent;
        down.place(placement.view, placement.view->heightForWidth(extent));
    }
    down.solve(_broken);
    for (std::size_t index = 0; index < _placements.size(); ++index) {
        const auto [start, extent] = down.spanOfPlaced(index);
        _placements[index].frame.origin.y = start;
        _placements[index].frame.size.height = extent;
    }
}

} // namespace nimbra
