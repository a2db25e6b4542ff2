#include "bindings/python/tuples.h"

namespace py = pybind11;

namespace velmora::python {

namespace {

char const* word(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Read:
        return "read";
    case CodeList::Answer::Refused:
        return list.offered ? "refused" : "not supported";
    case CodeList::Answer::Silent:
        return "no answer";
    case CodeList::Answer::Unreadable:
        break;
    }
    return "unreadable";
}

char const* word(ClearReport::Result result)
{
    switch (result) {
    case ClearReport::Result::Cleared:
        return "cleared";
    case ClearReport::Result::Refused:
        return "refused";
    case ClearReport::Result::NoAnswer:
        return "no answer";
    case ClearReport::Result::Unreadable:
        break;
    }
    return "unreadable";
}

py::list meaningsOf(TroubleCode const& code)
{
    py::list meanings;
    for (TroubleCode::Meaning const& meaning : code.meanings) {
        meanings.append(py::make_tuple(text(meaning.maker), text(meaning.text)));
    }
    return meanings;
}

} // namespace

py::tuple plain(TroubleCode const& code)
{
    return py::make_tuple(code.code, code.system, meaningsOf(code), textOrNone(code.maker),
                          text(printed(code).substr(code.code.size() + 1)));
}

py::tuple plain(CodeReport const& report)
{
    py::list lists;
    for (CodeList const& list : report.lists) {
        py::list codes;
        for (TroubleCode const& code : list.codes) {
            codes.append(plain(code));
        }
        lists.append(py::make_tuple(printed(list.kind), word(list), textOrNone(list.reason), codes));
    }
    return py::make_tuple(report.lamp, lists);
}

py::tuple plain(FreezeReport const& report)
{
    py::list readings;
    py::object code = py::none();
    if (report.frame) {
        code = plain(report.frame->code);
        for (FreezeFrame::Reading const& reading : report.frame->readings) {
            readings.append(py::make_tuple(
                text(reading.name), reading.value ? py::object(text(*reading.value)) : py::none(), text(reading.unit)));
        }
    }
    return py::make_tuple(printed(report.answer), report.number, code, readings);
}

py::tuple plain(ClearReport const& report)
{
    return py::make_tuple(word(report.result), textOrNone(report.reason));
}

} // namespace velmora::python
