# The source archive: cpack --config CPackSourceConfig.cmake, or the target package_source. With SOURCE_DATE_EPOCH the same
# sources give the same bytes, wherever they lie.
set(CPACK_PACKAGE_NAME velmora)
set(CPACK_PACKAGE_VENDOR Velmora)
set(CPACK_RESOURCE_FILE_LICENSE ${PROJECT_SOURCE_DIR}/LICENSE)
set(CPACK_VERBATIM_VARIABLES ON)
set(CPACK_GENERATOR TGZ)
set(CPACK_SOURCE_GENERATOR TGZ)
set(CPACK_SOURCE_PACKAGE_FILE_NAME velmora-${PROJECT_VERSION})

# What is made in the tree: the same as .gitignore, and what packaging leaves in debian/.
string(REGEX REPLACE "([][+.*()^$?|\\\\])" "\\\\\\1" tree "${PROJECT_SOURCE_DIR}")
set(CPACK_SOURCE_IGNORE_FILES
    "^${tree}/\\.git(/|$)"
    "^${tree}/build(-[^/]*)?/"
    "^${tree}/\\.cache/"
    "^${tree}/debian/(build|tmp|\\.debhelper)/"
    "/compile_commands\\.json$"
    "/(__pycache__|\\.mypy_cache|\\.pytest_cache|node_modules)/"
)
include(CPack)
