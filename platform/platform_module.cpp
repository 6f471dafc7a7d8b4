// The emulated operating system as one shared library: its content comes from the platform's
// area libraries, linked whole into it (see platform/CMakeLists.txt).
