#pragma once

#include <string>

class Connection;

/// Shows the calls of a gateway, again every two seconds, until the key q. The order is changed by the keys a (age),
/// r (rate) and s (score).
///
///     Top("age").run(connection);
class Top
{
public:
    /// `order`: age, rate or quality; anything else the gateway refuses.
    explicit Top(std::string order) : m_order(std::move(order)) {}

    /// Empty, or why the gateway refuses. Throws std::runtime_error when it does not answer.
    std::string run(Connection& connection);

private:
    bool follow(char key);

    std::string m_order;
};
