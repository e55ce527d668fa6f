#include "platform/views/LinearSystem.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace nimbra {

namespace {

/// Below these a difference is one of rounding: of values, in points, and of factors.
constexpr double kValueTolerance = 1e-6;
constexpr double kFactorTolerance = 1e-9;

void negate(double& constant, std::vector<double>& factors) {
    constant = -constant;
    for (double& factor : factors) {
        factor = -factor;
    }
}

} // namespace

std::size_t LinearSystem::addVariable(Range range) {
    const std::size_t number = _count++;
    _columns.push_back({.number = number, .range = range, .isSlack = false});
    for (Row& row : _rows) {
        row.factors.push_back(0);
    }
    return number;
}

double LinearSystem::valueOf(std::size_t variable) const {
    const auto row =
        std::ranges::find(_rows, variable, [](const Row& each) { return each.variable.number; });
    return row != _rows.end() ? row->constant : 0;
}

bool LinearSystem::demand(const std::vector<Term>& sum, LayoutRelation relation, double constant) {
    Row goal = rowFor(sum, constant);
    if (std::abs(goal.constant) < kValueTolerance) {
        goal.constant = 0;
    }
    const bool isEquation = relation == LayoutRelation::equal;
    if (relation == LayoutRelation::lessThanOrEqual || (isEquation && goal.constant > 0)) {
        negate(goal.constant, goal.factors);
    }
    if (goal.constant < 0) {
        return raiseToZero(std::move(goal), isEquation);
    }
    if (isEquation) {
        holdEquation(std::move(goal));
    } else {
        _rows.push_back(std::move(goal));
        forgetIdleRows();
    }
    return true;
}

LinearSystem::Row LinearSystem::rowFor(const std::vector<Term>& sum, double constant) {
    Row goal{.variable = {.number = _count++, .range = Range::notNegative, .isSlack = true},
             .constant = -constant,
             .factors = std::vector<double>(_columns.size())};
    for (const Term& term : sum) {
        const auto column = std::ranges::find(_columns, term.variable, &Variable::number);
        if (column != _columns.end()) {
            goal.factors[static_cast<std::size_t>(column - _columns.begin())] += term.factor;
            continue;
        }
        const auto row = std::ranges::find(_rows, term.variable,
                                           [](const Row& each) { return each.variable.number; });
        if (row == _rows.end()) {
            continue;
        }
        goal.constant += term.factor * row->constant;
        for (std::size_t index = 0; index < goal.factors.size(); ++index) {
            goal.factors[index] += term.factor * row->factors[index];
        }
    }
    for (double& factor : goal.factors) {
        factor = std::abs(factor) < kFactorTolerance ? 0 : factor;
    }
    return goal;
}

/// Moves along the edges of what is possible until the goal, which is negative, is 0.
bool LinearSystem::raiseToZero(Row goal, bool isEquation) {
    // The choice of the lowest number ends by itself; the limit is there for rounding errors.
    const std::size_t mostSteps = 100 + (10 * (_rows.size() + _columns.size()));
    for (std::size_t step = 0; step < mostSteps; ++step) {
        const std::size_t column = columnThatRaises(goal);
        if (column == none) {
            keepAtBest(goal);
            return false;
        }
        const std::size_t limit = rowThatLimits(goal, column);
        if (limit == none) {
            settle(std::move(goal), column, isEquation);
            return true;
        }
        exchange(_rows[limit], column);
        substitute(_rows[limit], column, goal);
    }
    return false;
}

/// The goal is 0 once `column` has given way to it, and stays so if it is an equation.
void LinearSystem::settle(Row goal, std::size_t column, bool isEquation) {
    exchange(goal, column);
    _rows.push_back(std::move(goal));
    if (isEquation) {
        removeColumn(column);
    }
}

/// The goal cannot come nearer to 0. What would lead it away again stays at 0 for good.
void LinearSystem::keepAtBest(const Row& goal) {
    for (std::size_t column = _columns.size(); column-- > 0;) {
        if (goal.factors[column] != 0) {
            removeColumn(column);
        }
    }
}

/// The goal is 0 already; from now on one of the columns follows from the others.
void LinearSystem::holdEquation(Row goal) {
    std::size_t chosen = none;
    for (std::size_t column = 0; column < _columns.size(); ++column) {
        if (goal.factors[column] != 0 &&
            (chosen == none ||
             (_columns[chosen].range != Range::any && _columns[column].range == Range::any))) {
            chosen = column;
        }
    }
    if (chosen != none) {
        settle(std::move(goal), chosen, true);
    }
}

std::size_t LinearSystem::columnThatRaises(const Row& goal) const {
    std::size_t found = none;
    for (std::size_t column = 0; column < _columns.size(); ++column) {
        const double factor = goal.factors[column];
        const bool raises = factor > 0 || (factor < 0 && _columns[column].range == Range::any);
        if (raises && (found == none || _columns[column].number < _columns[found].number)) {
            found = column;
        }
    }
    return found;
}

/// The row that would become negative first, before the goal is 0; none where the goal comes first.
std::size_t LinearSystem::rowThatLimits(const Row& goal, std::size_t column) const {
    const double direction = goal.factors[column] > 0 ? 1 : -1;
    double least = -goal.constant / std::abs(goal.factors[column]);
    std::size_t found = none;
    for (std::size_t index = 0; index < _rows.size(); ++index) {
        const Row& row = _rows[index];
        const double fall = -row.factors[column] * direction;
        if (row.variable.range == Range::any || fall <= 0) {
            continue;
        }
        const double way = row.constant / fall;
        const bool isLower =
            found != none && way == least && row.variable.number < _rows[found].variable.number;
        if (way < least || isLower) {
            least = way;
            found = index;
        }
    }
    return found;
}

/// The row's variable and the column's change places.
void LinearSystem::exchange(Row& row, std::size_t column) {
    const double factor = row.factors[column];
    row.constant /= -factor;
    for (double& other : row.factors) {
        other /= -factor;
    }
    row.factors[column] = 1 / factor;
    std::swap(row.variable, _columns[column]);
    for (Row& other : _rows) {
        if (&other != &row) {
            substitute(row, column, other);
        }
    }
}

/// Writes what `row` says for the variable that stood in `column` until now.
void LinearSystem::substitute(const Row& row, std::size_t column, Row& into) const {
    const double factor = std::exchange(into.factors[column], 0);
    if (factor == 0) {
        return;
    }
    into.constant += factor * row.constant;
    if (into.variable.range == Range::notNegative && std::abs(into.constant) < kValueTolerance) {
        into.constant = 0;
    }
    for (std::size_t index = 0; index < _columns.size(); ++index) {
        double& sum = into.factors[index];
        sum += factor * row.factors[index];
        if (std::abs(sum) < kFactorTolerance) {
            sum = 0;
        }
    }
}

void LinearSystem::removeColumn(std::size_t column) {
    const auto offset = static_cast<std::ptrdiff_t>(column);
    _columns.erase(_columns.begin() + offset);
    for (Row& row : _rows) {
        row.factors.erase(row.factors.begin() + offset);
    }
    forgetIdleRows();
}

/// Room that nothing can take away any more need not be watched.
void LinearSystem::forgetIdleRows() {
    std::erase_if(_rows, [](const Row& row) {
        return row.variable.isSlack &&
               std::ranges::all_of(row.factors, [](double factor) { return factor == 0; });
    });
}

} // namespace nimbra
