// Export: what WebAssembly exports to JavaScript.
#ifndef MORVIK_BINDINGS_JAVASCRIPT_EXPORT_H
#define MORVIK_BINDINGS_JAVASCRIPT_EXPORT_H

#define MORVIK_EXPORT extern "C" __attribute__((used, visibility("default")))

#endif
