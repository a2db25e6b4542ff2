# Makes C++ of the page's files, so that the program needs none of them where it runs: cmake -D OUT=... -D FILES=... -P.
# Each is kept packed, for the browsers, which all understand that, and plain. OUT.cpp is written. The same
# files give the same bytes where SOURCE_DATE_EPOCH is set, since a packed file holds its time.
function(append_bytes file name text)
    file(READ "${file}" hex HEX)
    string(REGEX REPLACE "([0-9a-f][0-9a-f])" "0x\\1," bytes "${hex}")
    string(REGEX REPLACE "(................................................................................)" "\\1\n"
                         bytes "${bytes}")
    set(${text} "${${text}}unsigned char const ${name}[] = {\n${bytes}\n};\n" PARENT_SCOPE)
endfunction()

set(arrays)
set(rows)
set(count 0)
foreach(path IN LISTS FILES)
    string(REGEX MATCH "^([^=]+)=(.+)$" ignored "${path}")
    set(name "${CMAKE_MATCH_1}")
    set(source "${CMAKE_MATCH_2}")
    file(ARCHIVE_CREATE OUTPUT "${OUT}.gz" PATHS "${source}" FORMAT raw COMPRESSION GZip COMPRESSION_LEVEL 9)
    append_bytes("${OUT}.gz" "packed${count}" arrays)
    append_bytes("${source}" "plain${count}" arrays)
    string(APPEND rows "    {\"${name}\", packed${count}, sizeof packed${count}, plain${count}, sizeof plain${count}},\n")
    math(EXPR count "${count} + 1")
endforeach()
file(REMOVE "${OUT}.gz")
file(WRITE "${OUT}.cpp" "#include \"libvelmora/dash/dashassets.h\"\n\nnamespace velmora {\n\nnamespace {\n\n${arrays}\nDashAsset const assets[${count}] = {\n${rows}};\n\n} // namespace\n\nstd::span<DashAsset const> dashAssets()\n{\n    return assets;\n}\n\n} // namespace velmora\n")
