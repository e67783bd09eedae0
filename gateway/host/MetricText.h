#pragma once

#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <vector>

/// How often a value was at most each of some bounds, and the sum of all: what quantiles are estimated from.
///
///     MetricHistogram setUp({0.1, 0.5, 1});
///     setUp.note(0.3);
class MetricHistogram
{
public:
    /// Rising. There is always one more place behind them, for what is above all.
    explicit MetricHistogram(std::vector<double> bounds) : m_bounds(std::move(bounds)), m_counts(m_bounds.size() + 1) {}

    void note(double value);
    std::vector<double> const& getBounds() const { return m_bounds; }
    /// How many were above the bound before, up to this one.
    std::vector<unsigned long long> const& getCounts() const { return m_counts; }
    double getSum() const { return m_sum; }

private:
    std::vector<double> m_bounds;
    std::vector<unsigned long long> m_counts;
    double m_sum = 0;
};

/// Figures of the process in the text format that Prometheus reads (version 0.0.4). A family has a name with its unit,
/// "_total" at the end where it only rises, and samples, which differ in their labels.
///
///     text.begin("calls_total", MetricText::COUNTER, "Calls since the start");
///     text.add(7, {{"interface", "trunk"}});
///
/// Throws std::bad_alloc.
class MetricText
{
public:
    enum Type
    {
        COUNTER, ///< never falls
        GAUGE,
        HISTOGRAM
    };
    using Labels = std::vector<std::pair<std::string_view, std::string_view>>; ///< any text as a value

    static constexpr char const* CONTENT_TYPE = "text/plain; version=0.0.4; charset=utf-8";
    /// Before every name but those that begin with "process_".
    static constexpr std::string_view PREFIX = "callcontrol_gateway_";

    /// A family, which must be there once.
    void begin(std::string_view name, Type type, std::string_view help);
    /// A sample of the family that was begun last. @{
    void add(double value, Labels const& labels = {});
    template <class Number>
    requires std::is_integral_v<Number>
    void add(Number value, Labels const& labels = {}) { addSample({}, labels, std::to_string(value)); }
    void add(MetricHistogram const& histogram, Labels const& labels = {});
    /// @}
    std::string const& get() const { return m_text; }

private:
    void addSample(std::string_view suffix, Labels const& labels, std::string const& value);

    std::string m_text;
    std::string m_name;
};
