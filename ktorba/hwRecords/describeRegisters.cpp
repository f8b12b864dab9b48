// Prints docs/registers.md, from the one table of the generator's registers.
#include <iostream>

#include "conventions/conventions.h"
#include "ktorba/hwRecords/registers.h"

namespace {

constexpr char kOpening[] =
    R"(# Registers

A host drives a generator through its register block, which the interface framework reaches by number and offset. The
library's command layer (`ktorba/commandControl/`) is the only code that does; the simulated generator implements the
same block. Constants and status are read, settings and commands are written; no register is both.

`ktorba/hwRecords/registers.h` is the table behind this page: after a change to it, write the page anew with
`ktorba_describe_registers`. The registers whose names begin with `Streaming` are there from version )";

constexpr char kTableHead[] = R"( of the block on.

| register | name | host | meaning |
|---|---|---|---|
)";

const char* directionOf(ktorba::RegisterAccess access) {
  return access == ktorba::RegisterAccess::Read ? "reads" : "writes";
}

}  // namespace

int main() {
  constexpr auto kVersion = ktorba::kStreamingGeneratorVersion;
  std::cout << kOpening << kVersion.major << '.' << kVersion.minor << kTableHead;
  for (const ktorba::RegisterInfo& info : ktorba::kRegisters) {
    const char* const name = info.name + 1;  // behind the k of a constant
    std::cout << "| " << static_cast<unsigned>(info.number) << " | `" << name << "` | " << directionOf(info.access)
              << " | " << info.meaning << " |\n";
  }
  return 0;
}
