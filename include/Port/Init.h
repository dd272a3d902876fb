// Static init objects of the portability layer. Every module that uses the layer owns one of each,
// constructed in this order; the layer is usable from the first construction to the last destruction.
#pragma once

namespace Port {

class FileInit {
public:
    FileInit();
    ~FileInit();
};

class PathListInit {
public:
    PathListInit();
    ~PathListInit();
};

// How many modules hold the layer up now (the sum of the four kinds divided by four is not
// promised; each kind counts its own).
int FileInitCount() noexcept;
int PathListInitCount() noexcept;

}  // namespace Port

namespace CitP {

class InstanceTableInit {
public:
    InstanceTableInit();
    ~InstanceTableInit();
};

class FactoryInit {
public:
    FactoryInit();
    ~FactoryInit();
};

int InstanceTableInitCount() noexcept;
int FactoryInitCount() noexcept;

}  // namespace CitP
