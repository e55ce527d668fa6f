#include "platform/views/LayoutConstraint.h"

#include "platform/views/View.h"

#include <charconv>
#include <cmath>
#include <optional>
#include <utility>

namespace nimbra {

namespace {

constexpr double kStandardMargin = 20;
constexpr double kStandardSpacing = 8;
/// No screen comes near it, and sums of such numbers are still exact.
constexpr double kMostPoints = 1e6;

bool isDigit(char character) {
    return character >= '0' && character <= '9';
}

bool beginsName(char character) {
    return (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z') ||
           character == '_';
}

/// Reads a visual format from left to right, up to the first mistake.
class VisualFormatReader {
public:
    VisualFormatReader(std::string_view text, const LayoutConstraint::Format& format)
        : _text(text), _format(format) {}

    [[nodiscard]] std::expected<std::vector<LayoutConstraint>, Error> read();

private:
    struct Predicate {
        LayoutRelation relation = LayoutRelation::equal;
        double constant = 0;
        /// The view whose extent is meant instead of a number.
        View* view = nullptr;
        float priority = requiredLayoutPriority;
    };
    struct Connection {
        bool isStandard = false;
        std::vector<Predicate> predicates;
    };
    enum class Subject : std::uint8_t { distance, extent };

    // Each reads one thing of the format; false where a mistake was found.
    bool readFormat();
    bool readFirstView();
    bool readNextViews();
    bool readView();
    bool readConnection(Connection& connection);
    bool readPredicates(Subject subject, std::vector<Predicate>& predicates);
    bool readPredicate(Subject subject, Predicate& predicate);
    bool readObject(Subject subject, Predicate& predicate);
    bool readPriority(Predicate& predicate);
    bool readNumberOrMetric(const char* expected, double& value);
    bool readNumber(double& value);
    bool readMetric(std::size_t position, const std::string& name, double& value);
    bool resolveView(std::size_t position, const std::string& name, View*& view);
    bool checkSuperview();

    void addDistance(View* after, LayoutAttribute afterAttribute, View* before,
                     LayoutAttribute beforeAttribute, const Connection& connection);
    void addExtent(const std::vector<Predicate>& predicates);

    [[nodiscard]] bool isAtEnd() const { return _position == _text.size(); }
    [[nodiscard]] char next() const { return isAtEnd() ? '\0' : _text[_position]; }
    bool take(std::string_view token);
    [[nodiscard]] std::string takeName();
    bool failAt(std::size_t position, const std::string& expected);
    bool fail(const std::string& expected) { return failAt(_position, expected); }

    [[nodiscard]] LayoutAttribute nearEdge() const {
        return _isVertical ? LayoutAttribute::top : LayoutAttribute::left;
    }
    [[nodiscard]] LayoutAttribute farEdge() const {
        return _isVertical ? LayoutAttribute::bottom : LayoutAttribute::right;
    }
    [[nodiscard]] LayoutAttribute extent() const {
        return _isVertical ? LayoutAttribute::height : LayoutAttribute::width;
    }

    std::string_view _text;
    const LayoutConstraint::Format& _format;
    std::size_t _position = 0;
    bool _isVertical = false;
    /// Where the format speaks of the superview's edge.
    std::optional<std::size_t> _edge;
    /// The superview of the views named so far, which may be null; nothing before the first.
    std::optional<View*> _superview;
    /// The view read last.
    View* _view = nullptr;
    std::vector<LayoutConstraint> _constraints;
    std::optional<Error> _error;
};

std::expected<std::vector<LayoutConstraint>, Error> VisualFormatReader::read() {
    if (_format.options != 0) {
        fail("no format option");
    } else {
        readFormat();
    }
    if (_error) {
        return std::unexpected(std::move(*_error));
    }
    return std::move(_constraints);
}

bool VisualFormatReader::readFormat() {
    _isVertical = take("V:");
    if (!_isVertical) {
        take("H:");
    }
    return readFirstView() && readNextViews();
}

bool VisualFormatReader::readFirstView() {
    if (next() == '|') {
        _edge = _position++;
        Connection connection;
        if (!readConnection(connection)) {
            return false;
        }
        if (next() != '[') {
            return fail("a view");
        }
        if (!readView() || !checkSuperview()) {
            return false;
        }
        addDistance(_view, nearEdge(), *_superview, nearEdge(), connection);
        return true;
    }
    return next() == '[' ? readView() : fail("a view or the superview's edge");
}

bool VisualFormatReader::readNextViews() {
    while (!isAtEnd()) {
        const std::size_t begin = _position;
        View* const before = _view;
        Connection connection;
        if (!readConnection(connection)) {
            return false;
        }
        if (next() == '|') {
            _edge = _position++;
            if (!checkSuperview()) {
                return false;
            }
            addDistance(*_superview, farEdge(), _view, farEdge(), connection);
            return isAtEnd() || fail("the end");
        }
        if (next() != '[') {
            return fail(begin == _position ? "a distance, a view, the superview's edge or the end"
                                           : "a view or the superview's edge");
        }
        if (!readView()) {
            return false;
        }
        addDistance(_view, nearEdge(), before, farEdge(), connection);
    }
    return true;
}

bool VisualFormatReader::readView() {
    take("[");
    const std::size_t position = _position;
    const std::string name = takeName();
    if (name.empty()) {
        return fail("a view's name");
    }
    if (!resolveView(position, name, _view)) {
        return false;
    }
    if (next() == '(') {
        std::vector<Predicate> predicates;
        if (!readPredicates(Subject::extent, predicates)) {
            return false;
        }
        addExtent(predicates);
    }
    return take("]") || fail("a closing bracket");
}

bool VisualFormatReader::readConnection(Connection& connection) {
    if (!take("-")) {
        connection.predicates = {Predicate{}};
        return true;
    }
    if (next() == '[' || next() == '|') {
        connection.isStandard = true;
        connection.predicates = {Predicate{}};
        return true;
    }
    if (next() == '(') {
        return readPredicates(Subject::distance, connection.predicates) &&
               (take("-") || fail("a hyphen"));
    }
    Predicate predicate;
    if (!readNumberOrMetric("a distance, a view or the superview's edge", predicate.constant)) {
        return false;
    }
    connection.predicates = {predicate};
    return take("-") || fail("a hyphen");
}

bool VisualFormatReader::readPredicates(Subject subject, std::vector<Predicate>& predicates) {
    for (bool isMore = take("("); isMore; isMore = take(",")) {
        if (!readPredicate(subject, predicates.emplace_back())) {
            return false;
        }
    }
    return take(")") || fail("a comma or a closing parenthesis");
}

bool VisualFormatReader::readPredicate(Subject subject, Predicate& predicate) {
    if (take("<=")) {
        predicate.relation = LayoutRelation::lessThanOrEqual;
    } else if (take(">=")) {
        predicate.relation = LayoutRelation::greaterThanOrEqual;
    } else {
        take("==");
    }
    return readObject(subject, predicate) && (!take("@") || readPriority(predicate));
}

bool VisualFormatReader::readObject(Subject subject, Predicate& predicate) {
    const std::size_t position = _position;
    if (subject == Subject::distance) {
        // Views may overlap, so a distance may be negative.
        const bool isNegative = take("-");
        if (isNegative && !isDigit(next())) {
            return fail("a number");
        }
        if (!readNumberOrMetric("a number or a metric's name", predicate.constant)) {
            return false;
        }
        predicate.constant = isNegative ? -predicate.constant : predicate.constant;
        return true;
    }
    if (beginsName(next())) {
        const std::string name = takeName();
        if (!_format.metrics.contains(name)) {
            return (_format.views.contains(name) ||
                    failAt(position, "the name of a metric or a view")) &&
                   resolveView(position, name, predicate.view);
        }
        if (!readMetric(position, name, predicate.constant)) {
            return false;
        }
    } else if (!readNumberOrMetric("a number or the name of a metric or a view",
                                   predicate.constant)) {
        return false;
    }
    return predicate.constant >= 0 || failAt(position, "an extent that is not negative");
}

bool VisualFormatReader::readPriority(Predicate& predicate) {
    const std::size_t position = _position;
    double priority = 0;
    if (!readNumberOrMetric("a priority", priority)) {
        return false;
    }
    if (priority < 0 || priority > requiredLayoutPriority) {
        return failAt(position, "a priority from 0 to 1000");
    }
    predicate.priority = static_cast<float>(priority);
    return true;
}

bool VisualFormatReader::readNumberOrMetric(const char* expected, double& value) {
    if (isDigit(next())) {
        return readNumber(value);
    }
    const std::size_t position = _position;
    const std::string name = takeName();
    return name.empty() ? fail(expected) : readMetric(position, name, value);
}

bool VisualFormatReader::readNumber(double& value) {
    const std::size_t position = _position;
    const auto takeDigits = [this] {
        while (isDigit(next())) {
            ++_position;
        }
    };
    takeDigits();
    if (take(".")) {
        if (!isDigit(next())) {
            return fail("a digit");
        }
        takeDigits();
    }
    const std::string_view number = _text.substr(position, _position - position);
    const auto read = std::from_chars(number.data(), number.data() + number.size(), value);
    return (read.ec == std::errc() && value <= kMostPoints) ||
           failAt(position, "a number up to 1000000");
}

bool VisualFormatReader::readMetric(std::size_t position, const std::string& name, double& value) {
    const auto metric = _format.metrics.find(name);
    if (metric == _format.metrics.end()) {
        return failAt(position, "the name of a metric");
    }
    value = metric->second;
    // Written so that what is no number fails.
    return std::abs(value) <= kMostPoints || failAt(position, "a metric from -1000000 to 1000000");
}

bool VisualFormatReader::resolveView(std::size_t position, const std::string& name, View*& view) {
    const auto found = _format.views.find(name);
    if (found == _format.views.end()) {
        return failAt(position, "the name of a view");
    }
    if (found->second == nullptr) {
        return failAt(position, "the name of a view that is not null");
    }
    view = found->second;
    if (!_superview) {
        _superview = view->superview();
    }
    return *_superview == view->superview() || failAt(position, "a view of the same superview");
}

bool VisualFormatReader::checkSuperview() {
    return *_superview != nullptr || failAt(*_edge, "views that have a superview");
}

void VisualFormatReader::addDistance(View* after, LayoutAttribute afterAttribute, View* before,
                                     LayoutAttribute beforeAttribute,
                                     const Connection& connection) {
    const bool isMargin = after == *_superview || before == *_superview;
    for (const Predicate& predicate : connection.predicates) {
        const double standard = isMargin ? kStandardMargin : kStandardSpacing;
        _constraints.push_back({.firstItem = after,
                                .firstAttribute = afterAttribute,
                                .relation = predicate.relation,
                                .secondItem = before,
                                .secondAttribute = beforeAttribute,
                                .constant = connection.isStandard ? standard : predicate.constant,
                                .priority = predicate.priority});
    }
}

void VisualFormatReader::addExtent(const std::vector<Predicate>& predicates) {
    for (const Predicate& predicate : predicates) {
        const bool isNumber = predicate.view == nullptr;
        _constraints.push_back({.firstItem = _view,
                                .firstAttribute = extent(),
                                .relation = predicate.relation,
                                .secondItem = predicate.view,
                                .secondAttribute = isNumber ? LayoutAttribute::none : extent(),
                                .constant = predicate.constant,
                                .priority = predicate.priority});
    }
}

bool VisualFormatReader::take(std::string_view token) {
    const bool found = _text.substr(_position).starts_with(token);
    if (found) {
        _position += token.size();
    }
    return found;
}

std::string VisualFormatReader::takeName() {
    const std::size_t position = _position;
    if (beginsName(next())) {
        while (beginsName(next()) || isDigit(next())) {
            ++_position;
        }
    }
    return std::string(_text.substr(position, _position - position));
}

bool VisualFormatReader::failAt(std::size_t position, const std::string& expected) {
    const std::size_t column = position + 1;
    _error = Error{.domain = "LayoutConstraint",
                   .code = static_cast<int>(column),
                   .description =
                       "column " + std::to_string(column) + ": " + expected + " was expected"};
    return false;
}

} // namespace

std::expected<std::vector<LayoutConstraint>, Error>
LayoutConstraint::constraintsWithVisualFormat(std::string_view visualFormat, const Format& format) {
    return VisualFormatReader(visualFormat, format).read();
}

} // namespace nimbra
