#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

Mark mark(LimitTest::Verdict verdict)
{
    static constexpr Mark marks[] = {Mark::Bad, Mark::Good, Mark::Faint, Mark::None};
    return marks[static_cast<int>(verdict)];
}

Cell number(std::string const& text)
{
    return {text.empty() ? "-" : text, Mark::None, true};
}

// Descriptions may be longer than a line is wide, so they stand last.
std::vector<Cell> limitTestHeads()
{
    return {{std::string("  ") + texts::result},
            {texts::test},
            {texts::value, Mark::None, true},
            {texts::minimum, Mark::None, true},
            {texts::maximum, Mark::None, true},
            {texts::unit},
            {texts::description}};
}

std::string shownVerdict(LimitTest const& test)
{
    char const* const verdict = verdictWord(test.verdict);
    return *verdict == '\0' ? "-" : verdict;
}

std::vector<Cell> limitTestRow(LimitTest const& test)
{
    return {{"  " + shownVerdict(test), mark(test.verdict)},
            {testId(test.id)},
            number(test.value),
            number(test.minimum),
            number(test.maximum),
            {test.unit},
            {test.description}};
}

constexpr std::size_t columnsOfTests = 72; // that six columns of figures and some words of a description need

// A test on a line that is too narrow for columns, its description below.
std::string narrowTest(LimitTest const& test, Style const& style)
{
    auto const shown = [](std::string const& text) { return text.empty() ? "-" : text; };
    std::string const unit = test.unit.empty() ? "" : " " + test.unit;
    std::string const range = fmt::format(texts::plain::range, shown(test.minimum), shown(test.maximum));
    return fmt::format("      {}  {}: {}{} {}\n{}", style.paint(mark(test.verdict), shownVerdict(test)),
                       testId(test.id), shown(test.value), unit, range,
                       wrapped(test.description, columnsOfTests, "        ", style));
}

// Tests of several things, each of them below its title.
class TestTable
{
public:
    explicit TestTable(Style const& style)
        : m_style(style), m_narrow(style.columns() != 0 && style.columns() < columnsOfTests), m_rows{limitTestHeads()}
    {}

    void add(std::string const& title, std::vector<LimitTest> const& tests)
    {
        m_lines += "    " + title + "\n";
        m_rows.push_back({{title}});
        for (LimitTest const& test : tests) {
            m_lines += narrowTest(test, m_style);
            m_rows.push_back(limitTestRow(test));
        }
    }

    std::string draw() const { return m_narrow ? m_lines : drawColumns(m_rows, "    ", m_style); }

private:
    Style const& m_style;
    bool const m_narrow;
    std::vector<std::vector<Cell>> m_rows;
    std::string m_lines;
};

std::size_t count(MonitorsReport const& report, LimitTest::Verdict verdict)
{
    std::size_t sum = 0;
    for (OnBoardMonitor const& monitor : report.monitors) {
        sum += static_cast<std::size_t>(
            std::count_if(monitor.tests.begin(), monitor.tests.end(),
                          [verdict](LimitTest const& test) { return test.verdict == verdict; }));
    }
    return sum;
}

std::string summary(MonitorsReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    std::size_t const failed = count(report, LimitTest::Verdict::Failed);
    std::size_t const without = count(report, LimitTest::Verdict::NoResult);
    std::string text = failed > 0 ? style.paint(Mark::Bad, fmt::format(texts::plain::testsFailed, failed)) + ", " : "";
    text += fmt::format(texts::plain::testsPassed, count(report, LimitTest::Verdict::Passed));
    return text + (without > 0 ? ", " + fmt::format(texts::plain::testsWithout, without) : "");
}

std::string monitorText(OxygenReport const& report, Style const& style)
{
    if (report.answer != TopicAnswer::Read) {
        return style.paint(Mark::Faint, answerWord(report.answer));
    }
    if (!report.complete) {
        return {};
    }
    return *report.complete ? style.paint(Mark::Good, texts::plain::oxygenComplete)
                            : style.paint(Mark::Warning, texts::plain::oxygenNotComplete);
}

std::string sensorList(OxygenReport const& report)
{
    std::string list;
    for (OxygenSensor const& sensor : report.sensors) {
        list += (list.empty() ? "" : ", ") + locationName(sensor.location);
    }
    return list;
}

std::string drawTests(std::vector<OxygenSensor> const& sensors, Style const& style)
{
    TestTable table(style);
    for (OxygenSensor const& sensor : sensors) {
        table.add(sensor.tests.empty() ? fmt::format(texts::plain::noTests, locationName(sensor.location))
                                       : locationName(sensor.location),
                  failedFirst(sensor.tests));
    }
    return table.draw();
}

} // namespace

std::string toText(MonitorsReport const& report, Style const& style)
{
    std::string text = labelledLine(texts::plain::monitorTests, summary(report, style));
    if (report.monitors.empty()) {
        return text;
    }
    TestTable table(style);
    for (OnBoardMonitor const& monitor : failedFirst(report.monitors)) {
        table.add(fmt::format("{:02X} {}", monitor.id, monitor.description), monitor.tests);
    }
    return text + table.draw();
}

std::string toText(OxygenReport const& report, Style const& style)
{
    std::string text = labelledLine(texts::plain::oxygenMonitor, monitorText(report, style));
    if (report.answer != TopicAnswer::Read) {
        return text;
    }
    text += labelledLine(texts::plain::oxygenSensors, sensorList(report));
    return text + (report.onCan ? labelledLine(texts::plain::oxygenTests, texts::plain::oxygenElsewhere)
                                : drawTests(report.sensors, style));
}

} // namespace velmora
