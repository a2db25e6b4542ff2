#include "bindings/python/nativecar.h"
#include "bindings/python/threads.h"

#include <velmora/error.h>
#include <velmora/version.h>

#include <pybind11/stl.h>

#include <map>

namespace py = pybind11;

namespace {

using velmora::Error;
using velmora::ErrorKind;

// The class of each kind of error; they are made once, and never dropped while the module stands.
std::map<ErrorKind, py::handle>& errorClasses()
{
    static std::map<ErrorKind, py::handle> classes;
    return classes;
}

py::handle addError(py::module_& module, char const* name, py::tuple const& bases, char const* doc)
{
    std::string const whole = std::string("velmora.") + name;
    PyObject* const made = PyErr_NewExceptionWithDoc(whole.c_str(), doc, bases.ptr(), nullptr);
    if (made == nullptr) {
        throw py::error_already_set();
    }
    module.attr(name) = py::reinterpret_steal<py::object>(made);
    return made;
}

void addErrors(py::module_& module)
{
    auto const bases = [](auto... base) { return py::make_tuple(py::reinterpret_borrow<py::object>(base)...); };
    py::handle const error = addError(module, "Error", bases(PyExc_Exception),
                                      "Something could not be done: message, kind (an exit code), hints.");
    auto const add = [&](ErrorKind kind, char const* name, char const* doc, auto... more) {
        errorClasses()[kind] = addError(module, name, bases(error.ptr(), more...), doc);
    };
    errorClasses()[ErrorKind::Failed] = error;
    add(ErrorKind::WrongUse, "WrongUseError", "What was asked for makes no sense.", PyExc_ValueError);
    add(ErrorKind::PortFailed, "PortError", "The port could not be opened.", PyExc_ConnectionError);
    add(ErrorKind::AdapterSilent, "AdapterSilentError", "Nothing that looks like an adapter answers.",
        PyExc_TimeoutError);
    add(ErrorKind::VehicleSilent, "VehicleSilentError", "The adapter works, no control module answers.",
        PyExc_TimeoutError);
    add(ErrorKind::NotSupported, "NotSupportedError", "The vehicle does not offer what was asked for.");
    add(ErrorKind::Refused, "RefusedError", "The vehicle said no.");
    add(ErrorKind::LinkLost, "LinkLostError", "The connection broke.", PyExc_ConnectionError);
    add(ErrorKind::Interrupted, "InterruptedByUserError", "The user wanted an end.");
}

void raise(Error const& error)
{
    auto const found = errorClasses().find(error.kind());
    py::handle const type = found != errorClasses().end() ? found->second : errorClasses()[ErrorKind::Failed];
    py::object const instance = type(error.what());
    instance.attr("kind") = static_cast<int>(error.kind());
    instance.attr("hints") = py::cast(error.hints());
    PyErr_SetObject(type.ptr(), instance.ptr());
}

} // namespace

PYBIND11_MODULE(_velmora, module)
{
    using namespace velmora::python;
    module.doc() = "The native part of velmora.";
    module.attr("version") = velmora::versionText;
    addErrors(module);
    py::register_exception_translator([](std::exception_ptr thrown) {
        try {
            std::rethrow_exception(thrown);
        } catch (Error const& error) {
            raise(error);
        }
    });

    py::class_<NativeWatch>(module, "Watch")
        .def("take", &NativeWatch::take, py::arg("seconds"))
        .def("stop", &NativeWatch::stop)
        .def_property_readonly("link_is_up", &NativeWatch::linkIsUp)
        .def_property_readonly("stopped", &NativeWatch::stopped)
        .def_property_readonly("lost", &NativeWatch::lost);
    py::class_<NativeCar>(module, "Car")
        .def(py::init(&openCar), py::arg("port"), py::arg("options"))
        .def("read", &NativeCar::read, py::arg("sensors"))
        .def("watch", &NativeCar::watch, py::arg("sensors"), py::arg("callback"))
        .def("modules", &NativeCar::modules)
        .def("sensors", &NativeCar::sensors)
        .def("codes", &NativeCar::codes)
        .def("freeze_frame", &NativeCar::freezeFrame, py::arg("frame"))
        .def("readiness", &NativeCar::readiness)
        .def("monitors", &NativeCar::monitors)
        .def("info", &NativeCar::info)
        .def("counters", &NativeCar::counters)
        .def("clear", &NativeCar::clear)
        .def("report_json", &NativeCar::reportJson)
        .def("reconnect", &NativeCar::reconnect)
        .def("close", &NativeCar::close);
    module.def("explain", &explainCode, py::arg("code"));
    module.def("callback_seconds", &callbackSeconds, py::arg("callback"), py::arg("count"));
    py::module_::import("atexit").attr("register")(py::cpp_function(&finishThreads));
}
