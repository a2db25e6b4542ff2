#include "libvelmora/report/document/moduletables.h"
#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/finding/findings.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

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
    std::string const sensors = std::to_string(module.supported.size());
    addFact(facts, texts::sensors,
            toldOffers(module)
                ? sensors
                : fmt::format(texts::notAllTold, sensors, texts::answers[static_cast<std::size_t>(module.offers)]));
    addFact(facts, texts::distanceWithLamp, withUnit(info.withLamp.distance));
    addFact(facts, texts::timeWithLamp, withUnit(info.withLamp.runTime));
    addFact(facts, texts::distanceSinceCleared, withUnit(info.sinceCleared.distance));
    addFact(facts, texts::timeSinceCleared, withUnit(info.sinceCleared.runTime));
    return {1,
            fmt::format("{} {:X}{}{}", texts::module, module.id, module.name.empty() ? "" : ": ", module.name),
            {facts},
            anchorOf({DataTopic::Info, module.id})};
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

DocumentMark markOf(CodeKind kind)
{
    return kind == CodeKind::Pending ? DocumentMark::Warning : DocumentMark::Bad;
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
    return {std::to_string(list.codes.size()), markOf(list.kind)};
}

std::string makerLine(MakerChoice const& maker)
{
    switch (maker.by) {
    case MakerChoice::By::Option:
        return fmt::format(texts::codesByOption, maker.maker);
    case MakerChoice::By::Vin:
        return fmt::format(texts::codesByVin, maker.maker);
    case MakerChoice::By::Guess:
        return fmt::format(texts::codesByGuess, maker.maker, maker.maker);
    default:
        return {};
    }
}

DocumentSection codeSection(CodeReport const& report)
{
    DocumentFacts facts;
    facts.rows.push_back({texts::lamp, lampCell(report.lamp)});
    DocumentTable table{{{texts::kind}, {texts::code}, {texts::make}, {texts::meaning}}, {}};
    for (CodeList const& list : report.lists) {
        facts.rows.push_back({kindTitle(list.kind), listCell(list)});
        for (TroubleCode const& code : list.codes) {
            table.rows.push_back(codeRow(kindTitle(list.kind), code, markOf(list.kind)));
        }
    }
    addFact(facts, texts::codesRead, makerLine(report.maker));
    DocumentSection section{2, texts::codes, {facts}};
    if (!table.rows.empty()) {
        section.blocks.push_back(table);
    }
    return section;
}

// What a module did not tell, as a paragraph, unless it does not offer it, which is told of nobody.
std::optional<DocumentSection> untoldSection(std::string const& title, TopicAnswer answer)
{
    if (answer == TopicAnswer::NotOffered) {
        return std::nullopt;
    }
    return DocumentSection{
        2, title, {DocumentParagraph{{texts::answers[static_cast<std::size_t>(answer)], DocumentMark::Faint}}}};
}

std::optional<DocumentSection> freezeSection(FreezeReport const& report)
{
    std::string const title = fmt::format("{} {}", texts::freezeFrame, report.number);
    if (!hasAnswer(report)) {
        return untoldSection(title, report.answer);
    }
    DocumentSection section{2, title, {}};
    if (!report.frame) {
        section.blocks.push_back(DocumentParagraph{{texts::noneStored}});
        return section;
    }
    DocumentTable code{{{texts::code}, {texts::make}, {texts::meaning}}, {}};
    std::vector<DocumentCell> cells = codeRow("", report.frame->code, DocumentMark::Bad);
    code.rows.push_back({cells[1], cells[2], cells[3]});
    DocumentTable readings{{{texts::sensor}, {texts::value, DocumentMark::None, true}, {texts::unit}}, {}};
    for (FreezeFrame::Reading const& each : report.frame->readings) {
        readings.rows.push_back({{each.name}, {each.value.value_or(""), DocumentMark::None, true}, {each.unit}});
    }
    section.blocks.push_back(code);
    section.blocks.push_back(readings);
    return section;
}

DocumentCell statusCell(std::optional<ReadinessStatus> status, bool marked)
{
    if (!status) {
        return {};
    }
    bool const open = marked && *status == ReadinessStatus::NotComplete;
    return {texts::statuses[static_cast<std::size_t>(*status)], open ? DocumentMark::Warning : DocumentMark::None};
}

std::optional<DocumentSection> readinessSection(ReadinessReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untoldSection(texts::readiness, report.answer);
    }
    DocumentTable table{{{texts::monitor}, {texts::sinceCleared}, {texts::thisCycle}}, {}};
    for (ReadinessMonitor const& each : notCompleteFirst(report.monitors)) {
        table.rows.push_back({{each.name}, statusCell(each.sinceCleared, true), statusCell(each.thisCycle, false)});
    }
    return DocumentSection{2, texts::readiness, {table}};
}

std::optional<DocumentSection> valueSection(std::vector<LiveValue> const& values)
{
    return values.empty() ? std::nullopt : std::optional(DocumentSection{2, texts::values, {valueTable(values)}});
}

std::optional<DocumentSection> monitorSection(MonitorsReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untoldSection(texts::monitorTests, report.answer);
    }
    DocumentSection section{2, texts::monitorTests, {}};
    for (OnBoardMonitor const& monitor : failedFirst(report.monitors)) {
        section.blocks.push_back(testTable(fmt::format("{:02X} {}", monitor.id, monitor.description), monitor.tests));
    }
    return section;
}

std::optional<DocumentSection> oxygenSection(OxygenReport const& report)
{
    if (report.answer != TopicAnswer::Read || report.onCan) {
        return report.onCan ? std::nullopt : untoldSection(texts::oxygenTests, report.answer);
    }
    DocumentSection section{2, texts::oxygenTests, {}};
    for (OxygenSensor const& sensor : report.sensors) {
        section.blocks.push_back(testTable(locationName(sensor.location), failedFirst(sensor.tests)));
    }
    return section;
}

std::optional<DocumentSection> counterSection(CountersReport const& report)
{
    if (report.answer != TopicAnswer::Read) {
        return untoldSection(texts::counters, report.answer);
    }
    return DocumentSection{2, texts::counters, counterTables(report)};
}

// Each with the module in its title, since a report has several of a kind, and with the anchor that findings lead to.
void addTopic(std::vector<DocumentSection>& sections, ModuleReport const& module, DataTopic topic,
              std::optional<DocumentSection> section, bool leads = true)
{
    if (section && !section->blocks.empty()) {
        section->title = fmt::format(texts::inSection, section->title, fmt::format("{:X}", module.id));
        section->anchor = leads ? anchorOf({topic, module.id}) : std::string();
        sections.push_back(std::move(*section));
    }
}

} // namespace

std::vector<DocumentSection> moduleSections(ModuleReport const& module, ReportFacts const& facts)
{
    std::vector<DocumentSection> sections = {infoSection(module, facts)};
    addTopic(sections, module, DataTopic::Codes, codeSection(module.codes));
    addTopic(sections, module, DataTopic::Codes, freezeSection(module.freeze), false);
    addTopic(sections, module, DataTopic::Readiness, readinessSection(module.readiness));
    addTopic(sections, module, DataTopic::Values, valueSection(module.values));
    addTopic(sections, module, DataTopic::Monitors, monitorSection(module.monitors));
    addTopic(sections, module, DataTopic::Oxygen, oxygenSection(module.oxygen));
    addTopic(sections, module, DataTopic::Info, counterSection(module.counters), false);
    return sections;
}

} // namespace velmora
