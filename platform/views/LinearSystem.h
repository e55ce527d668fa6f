#pragma once

#include "platform/views/LayoutConstraint.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace nimbra {

/// Numbers that stand in linear relations. Each demand is met as far as the earlier ones, which
/// are never touched again, leave room for it: the order of the demands is their rank.
///
/// Not thread-safe. A simplex tableau: each row gives a variable by those of the columns, which are
/// 0.
class LinearSystem {
public:
    enum class Range : std::uint8_t { any, notNegative };
    struct Term {
        std::size_t variable;
        double factor;
    };

    /// A new variable, of which nothing else is asked.
    std::size_t addVariable(Range range);

    /// Asks that `sum relation constant`. Gives whether it can be; where it cannot, the sum comes
    /// and stays as near as it can.
    bool demand(const std::vector<Term>& sum, LayoutRelation relation, double constant);

    /// The variable in a solution of all demands. There is only one if each variable was demanded
    /// to be some number.
    [[nodiscard]] double valueOf(std::size_t variable) const;

private:
    struct Variable {
        std::size_t number;
        Range range;
        /// Stands for the room that an inequality leaves; nobody asks for its value.
        bool isSlack;
    };
    struct Row {
        Variable variable;
        double constant = 0;
        std::vector<double> factors;
    };
    static constexpr std::size_t none = static_cast<std::size_t>(-1);

    [[nodiscard]] Row rowFor(const std::vector<Term>& sum, double constant);
    bool raiseToZero(Row goal, bool isEquation);
    void settle(Row goal, std::size_t column, bool isEquation);
    void keepAtBest(const Row& goal);
    void holdEquation(Row goal);
    [[nodiscard]] std::size_t columnThatRaises(const Row& goal) const;
    [[nodiscard]] std::size_t rowThatLimits(const Row& goal, std::size_t column) const;
    void exchange(Row& row, std::size_t column);
    void substitute(const Row& row, std::size_t column, Row& into) const;
    void removeColumn(std::size_t column);
    void forgetIdleRows();

    std::size_t _count = 0;
    std::vector<Variable> _columns;
    std::vector<Row> _rows;
};

} // namespace nimbra
