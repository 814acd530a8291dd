// kelform under Node (the wasm build): the program sees the process's environment
// (KELFORM_TODAY, KELFORM_MAX_FILE_BYTES), as the native one does.
Module['preRun'] = Module['preRun'] || [];
Module['preRun'].push(function () {
  Object.assign(ENV, process.env);
});
