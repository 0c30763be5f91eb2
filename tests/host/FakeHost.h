// A host for native tests: records what the library prints, alerts and reports, hands it arguments,
// keeps the LISP result, and can refuse allocations on demand.
#pragma once

#include "hostapi/HostApi.h"

#include <string>
#include <vector>

struct FakeHost {
    FakeHost();  // installs itself as the host
    ~FakeHost(); // frees what is left and uninstalls

    // The command line, alert box and failure report, each event in order: "print:", "alert:", "fail:".
    std::vector<std::string> events;
    std::string printed() const;

    // The arguments of the next call, built with the helpers below.
    resbuf* args = nullptr;
    void AddShort(short v);
    void AddString(const std::wstring& s);
    void AddReal(double v);

    // The LISP result: "void", "nil", or the printed list.
    std::string result = "unset";
    int funCode = 0;

    // Allocation failures: the n-th allocation from now (1 = the next) fails; 0 = none.
    int failAllocationAt = 0;
    int liveNodes = 0;

    // Function registry and dynamic-linker calls.
    std::vector<std::string> calls;
    int failDefunAt = 0; // the n-th acedDefun fails (1 = the first)

    static FakeHost* current;
};

// Prints a chain in LISP form: ("a" ("b" 1 2.5)).
std::string PrintChain(const resbuf* rb);
