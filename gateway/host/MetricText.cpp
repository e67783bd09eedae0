#include "host/MetricText.h"

#include <algorithm>
#include <spdlog/fmt/fmt.h>

namespace
{
constexpr char const* TYPE_NAMES[] = {"counter", "gauge", "histogram"};

std::string ESCAPED(std::string_view text)
{
    std::string escaped;
    for (char const c : text)
        if (c == '\n')
            escaped += "\\n";
        else
            escaped += c == '\\' || c == '"' ? std::string{'\\', c} : std::string{c};
    return escaped;
}
} // namespace

void MetricHistogram::note(double value)
{
    auto const place = std::lower_bound(m_bounds.begin(), m_bounds.end(), value);
    ++m_counts[static_cast<std::size_t>(place - m_bounds.begin())];
    m_sum += value;
}

void MetricText::begin(std::string_view name, Type type, std::string_view help)
{
    m_name = name.starts_with("process_") ? std::string(name) : fmt::format("{}{}", PREFIX, name);
    m_text += fmt::format("# HELP {} {}\n# TYPE {} {}\n", m_name, help, m_name, TYPE_NAMES[type]);
}

void MetricText::add(double value, Labels const& labels) { addSample({}, labels, fmt::format("{}", value)); }

void MetricText::add(MetricHistogram const& histogram, Labels const& labels)
{
    Labels withBound = labels;
    withBound.emplace_back("le", "");
    unsigned long long upTo = 0;
    for (std::size_t i = 0; i < histogram.getCounts().size(); ++i)
    {
        upTo += histogram.getCounts()[i];
        std::string const bound =
            i < histogram.getBounds().size() ? fmt::format("{}", histogram.getBounds()[i]) : "+Inf";
        withBound.back().second = bound;
        addSample("_bucket", withBound, std::to_string(upTo));
    }
    addSample("_sum", labels, fmt::format("{}", histogram.getSum()));
    addSample("_count", labels, std::to_string(upTo));
}

void MetricText::addSample(std::string_view suffix, Labels const& labels, std::string const& value)
{
    m_text.append(m_name).append(suffix);
    char before = '{';
    for (auto const& [name, text] : labels)
    {
        m_text += fmt::format("{}{}=\"{}\"", before, name, ESCAPED(text));
        before = ',';
    }
    m_text.append(labels.empty() ? " " : "} ").append(value).append("\n");
}
