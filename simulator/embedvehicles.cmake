# Writes OUTPUT, a C++ source that holds the vehicle files of the ;-list VEHICLES as text.
set(rows "")
set(count 0)
foreach(path IN LISTS VEHICLES)
    get_filename_component(name "${path}" NAME_WE)
    file(READ "${path}" text)
    string(APPEND rows "    {\"${name}\", R\"toml(${text})toml\"},\n")
    math(EXPR count "${count} + 1")
endforeach()
file(
    WRITE "${OUTPUT}"
    "// Made by embedvehicles.cmake from the files in simulator/vehicles.\n"
    "#include \"simulator/car/embeddedvehicles.h\"\n\n"
    "namespace obdsim\n{\n\n"
    "const EmbeddedVehicle embeddedVehicles[] = {\n${rows}};\n"
    "const std::size_t embeddedVehicleCount = ${count};\n\n"
    "} // namespace obdsim\n"
)
