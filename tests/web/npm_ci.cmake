# Installs the browser tests' npm packages (package-lock.json) into DEST, once per lock file.
# PLAYWRIGHT_SKIP_BROWSER_DOWNLOAD and --ignore-scripts: nothing but the packages is fetched;
# the tests drive Debian's chromium.
file(MAKE_DIRECTORY ${DEST})
file(COPY_FILE ${SRC}/package.json ${DEST}/package.json ONLY_IF_DIFFERENT)
file(COPY_FILE ${SRC}/package-lock.json ${DEST}/package-lock.json ONLY_IF_DIFFERENT)
if(EXISTS ${DEST}/node_modules/.package-lock.json AND ${DEST}/node_modules/.package-lock.json IS_NEWER_THAN ${DEST}/package-lock.json)
  return()
endif()
find_program(NPM npm)
if(NOT NPM)
  message(FATAL_ERROR "npm not found: tools/setup --web installs it (the browser test needs playwright-core)")
endif()
set(ENV{PLAYWRIGHT_SKIP_BROWSER_DOWNLOAD} 1)
execute_process(COMMAND ${NPM} ci --ignore-scripts --no-audit --no-fund
  WORKING_DIRECTORY ${DEST} RESULT_VARIABLE result OUTPUT_VARIABLE out ERROR_VARIABLE err TIMEOUT 240)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "npm ci failed, so the browser test cannot run: it needs playwright-core from the npm "
                      "registry (is the registry reachable?).\n${out}${err}")
endif()
