// Per-class editor layouts. A plug-in's folder registers a function that
// groups its parameters and adds its displays; a class without one gets the
// editor's default layout (every parameter in table order, meters as bars).
//
//   static const EditorLayoutRegistry::Entry kLayout("ZenLimiter", &BuildLimiterEditor);
#pragma once

class ZenEditor;

class EditorLayoutRegistry {
public:
    using Function = void (*)(ZenEditor& editor);

    struct Entry {
        Entry(const char* className, Function function);
    };

    // Null when the class registered no layout.
    static Function Find(const char* className);
};
