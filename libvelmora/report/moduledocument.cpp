#include "libvelmora/report/reportdocument.h"
#include "libvelmora/report/texts.h"

#include <fmt/format.h>

#include <charconv>

namespace velmora {

namespace {

void addFact(DocumentFacts& facts, char const* label, std::string const& text)
{
    if (!text.empty()) {
        facts.rows.push_back({label, {text}});
    }
}

std::string withUnit(std::optional<InfoReport::Reading> const& reading)
{
    return reading ? reading->value + (reading->unit.empty() ? "" : " " + reading->unit) : std::string();
}

DocumentSection infoSection(ModuleReport const& module, ReportFacts const& shown)
{
    DocumentFacts facts;
    InfoReport const& info = module.info;
    addFact(facts, texts::description, info.description);
    addFact(facts, texts::standard, info.standard);
    addFact(facts, texts::protocol, info.protocol);
    addFact(facts, texts::vin, shownVin(info.vin, shown.maskVin));
    for (InfoReport::Calibration const& each : info.calibrations) {
        addFact(facts, texts::calibration, each.id);
        addFact(facts, texts::verification, each.verification);
    }
    addFact(facts, texts::engineSerial, info.engineSerialNumber);
    addFact(facts, texts::erotan, info.erotan);
    addFact(facts, texts::sensors, std::to_string(module.supported.size()));
    addFact(facts, texts::distanceWithLamp, withUnit(info.withLamp.distance));
    addFact(facts, texts::timeWithLamp, withUnit(info.withLamp.runTime));
    addFact(facts, texts::distanceSinceCleared, withUnit(info.sinceCleared.distance));
    addFact(facts, texts::timeSinceCleared, withUnit(info.sinceCleared.runTime));
    return {
        1, fmt::format("{} {:X}{}{}", texts::module, module.id, module.name.empty() ? "" : ": ", module.name), {facts}};
}

DocumentCell lampCell(std::optional<bool> const& lamp)
{
    if (!lamp) {
        return {texts::notTold, DocumentMark::Faint};
    }
    return *lamp ? DocumentCell{texts::on, DocumentMark::Bad} : DocumentCell{texts::off, DocumentMark::Good};
}

char const* kindTitle(CodeKind kind)
{
    static constexpr char const* titles[] = {texts::confirmed, texts::pending, texts::permanent};
    return titles[static_cast<int>(kind)];
}

DocumentCell listCell(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Refused:
        return {fmt::format("{}: {}", texts::refused, list.reason), DocumentMark::Faint};
    case CodeList::Answer::Silent:
        return {texts::noAnswer, DocumentMark::Faint};
    case CodeList::Answer::Unreadable:
        return {texts::cantBeRead, DocumentMark::Faint};
    default:
        break;
    }
    if (list.codes.empty()) {
        return {texts::noneStored, DocumentMark::Good};
    }
    DocumentMark const mark = list.kind == CodeKind::Pending ? DocumentMark::Warning : DocumentMark::Bad;
    return {std::to_string(list.codes.size()), mark};
}

void addCodeRows(DocumentTable& table, char const* kind, TroubleCode const& code, DocumentMark mark)
{
    TroubleCode::Meaning const* const meaning = meaningOf(code);
    table.rows.push_back(
        {{kind}, {code.code, mark}, {meaning != nullptr ? meaning->maker : std::string()}, {meaningText(code)}});
}

DocumentSection codeSection(CodeReport const& report)
{
    DocumentFacts facts;
    facts.rows.push_back({texts::lamp, lampCell(report.lamp)});
    DocumentTable table{{{texts::kind}, {texts::code}, {texts::make}, {texts::meaning}}, {}};
    for (CodeList const& list : report.lists) {
        facts.rows.push_back({kindTitle(list.kind), listCell(list)});
        for (TroubleCode const& code : list.codes) {
            addCodeRows(table, kindTitle(list.kind), code,
                        list.kind == CodeKind::Pending ? DocumentMark::Warning : DocumentMark::Bad);
        }
    }
    DocumentSection section{2, texts::codes, {facts}};
    if (!table.rows.empty()) {
        section.blocks.push_back(table);
    }
    return section;
}

std::optional<DocumentSection> freezeSection(FreezeReport const& report)
{
    if (!hasAnswer(report)) {
        return std::nullopt;
    }
    DocumentSection section{2, fmt::format("{} {}", texts::freezeFrame, report.number), {}};
    if (!report.frame) {
        section.blocks.push_back(DocumentParagraph{{texts::noneStored}});
        return section;
    }
    DocumentTable code{{{texts::freezeCode}, {texts::code}, {texts::make}, {texts::meaning}}, {}};
    addCodeRows(code, "", report.frame->code, DocumentMark::Bad);
    DocumentTable readings{{{texts::sensor}, {texts::value, DocumentMark::None, true}, {texts::unit}}, {}};
    for (FreezeFrame::Reading const& each : report.frame->readings) {
        readings.rows.push_back({{each.name}, {each.value.value_or(""), DocumentMark::None, true}, {each.unit}});
    }
    section.blocks.push_back(code);
    section.blocks.push_back(readings);
    return section;
}

// What a module did not tell, as a paragraph, unless it does not offer it, which is told of nobody.
std::optional<DocumentSection> untold(char const* title, TopicAnswer answer)
{
    if (answer == TopicAnswer::NotOffered) {
        return std::nullopt;
    }
    return DocumentSection{2, title, {DocumentParagraph{{answerWord(answer), DocumentMark::Faint}}}};
}

DocumentMark statusMark(ReadinessStatus status)
{
    return status == ReadinessStatus::NotComplete ? DocumentMark::Warning : DocumentMark::None;
}

std::optional<DocumentSection> readinessSection(ReadinessReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untold(texts::readiness, report.answer);
    }
    DocumentTable table{{{texts::monitor}, {texts::sinceCleared}, {texts::thisCycle}}, {}};
    for (ReadinessMonitor const& each : notCompleteFirst(report.monitors)) {
        table.rows.push_back({{each.name},
                              {statusWord(each.sinceCleared), statusMark(each.sinceCleared)},
                              {each.thisCycle ? statusWord(*each.thisCycle) : ""}});
    }
    return DocumentSection{2, texts::readiness, {table}};
}

std::optional<double> numberIn(std::string const& text)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool const whole = !text.empty() && error == std::errc() && end == text.data() + text.size();
    return whole ? std::optional(number) : std::nullopt;
}

std::optional<LimitBar> barOf(LimitTest const& test)
{
    auto const value = numberIn(test.value);
    LimitBar const bar{value.value_or(0.0), numberIn(test.minimum), numberIn(test.maximum)};
    bool const drawable = value && (bar.min || bar.max) && !(bar.min && bar.max && *bar.min >= *bar.max) &&
                          test.verdict != LimitTest::Verdict::NoResult;
    return drawable ? std::optional(bar) : std::nullopt;
}

std::vector<DocumentCell> testRow(LimitTest const& test)
{
    static constexpr DocumentMark marks[] = {DocumentMark::Bad, DocumentMark::Good, DocumentMark::Faint,
                                             DocumentMark::None};
    std::string const verdict = verdictWord(test.verdict);
    return {{verdict.empty() ? texts::constant : verdict, marks[static_cast<int>(test.verdict)]},
            {fmt::format("{} {}", testId(test.id), test.description)},
            {test.value, DocumentMark::None, true, barOf(test)},
            {test.minimum, DocumentMark::None, true},
            {test.maximum, DocumentMark::None, true},
            {test.unit}};
}

DocumentTable testTable(std::string const& name)
{
    return {{{texts::result},
             {name.empty() ? std::string(texts::test) : name},
             {texts::value, DocumentMark::None, true},
             {texts::minimum, DocumentMark::None, true},
             {texts::maximum, DocumentMark::None, true},
             {texts::unit}},
            {}};
}

std::optional<DocumentSection> monitorSection(MonitorsReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untold(texts::monitorTests, report.answer);
    }
    DocumentSection section{2, texts::monitorTests, {}};
    for (OnBoardMonitor const& monitor : failedFirst(report.monitors)) {
        DocumentTable table = testTable(fmt::format("{:02X} {}", monitor.id, monitor.description));
        for (LimitTest const& test : monitor.tests) {
            table.rows.push_back(testRow(test));
        }
        section.blocks.push_back(table);
    }
    return section;
}

std::optional<DocumentSection> oxygenSection(OxygenReport const& report)
{
    if (report.answer != TopicAnswer::Read || report.onCan) {
        return report.onCan ? std::nullopt : untold(texts::oxygenTests, report.answer);
    }
    DocumentSection section{2, texts::oxygenTests, {}};
    for (OxygenSensor const& sensor : report.sensors) {
        DocumentTable table = testTable(locationName(sensor.location));
        for (LimitTest const& test : failedFirst(sensor.tests)) {
            table.rows.push_back(testRow(test));
        }
        section.blocks.push_back(table);
    }
    return section;
}

std::optional<DocumentSection> counterSection(CountersReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untold(texts::counters, report.answer);
    }
    DocumentTable table{{{texts::counter}, {texts::value, DocumentMark::None, true}}, {}};
    for (CountersReport::Counter const& each : report.counters) {
        table.rows.push_back({{each.name}, {std::to_string(each.value), DocumentMark::None, true}});
    }
    return DocumentSection{2, texts::counters, {table}};
}

} // namespace

std::vector<DocumentSection> moduleSections(ModuleReport const& module, ReportFacts const& facts)
{
    std::vector<DocumentSection> sections = {infoSection(module, facts), codeSection(module.codes)};
    for (auto const& section :
         {freezeSection(module.freeze), readinessSection(module.readiness), monitorSection(module.monitors),
          oxygenSection(module.oxygen), counterSection(module.counters)}) {
        if (section) {
            sections.push_back(*section);
        }
    }
    return sections;
}

} // namespace velmora
