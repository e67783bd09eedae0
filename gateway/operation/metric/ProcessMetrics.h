#pragma once

class MetricText;

/// The process as the system sees it, under the names that all programs have for it. Any thread.
namespace ProcessMetrics
{
void ADD(MetricText& text);
} // namespace ProcessMetrics
