#include "icuprobe/system_data.h"

#include <dlfcn.h>
#include <link.h>
#include <unicode/utypes.h>

#include <fstream>
#include <stdexcept>

// The entry point of ICU's data library: the whole package, as pkgdata
// compiled it into the library. Its size is only in the symbol table.
extern "C" const char U_ICUDATA_ENTRY_POINT[];

std::string write_system_data(const std::string& dir) {
  Dl_info info{};
  void* entry = nullptr;
  if (dladdr1(U_ICUDATA_ENTRY_POINT, &info, &entry, RTLD_DL_SYMENT) == 0 ||
      entry == nullptr) {
    throw std::runtime_error("the system's ICU data library has no " +
                             std::string(info.dli_sname != nullptr
                                             ? info.dli_sname
                                             : "data entry point"));
  }
  const auto* symbol = static_cast<const ElfW(Sym)*>(entry);
  std::string path = dir + "/" + U_ICUDATA_NAME + ".dat";
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out.write(U_ICUDATA_ENTRY_POINT,
            static_cast<std::streamsize>(symbol->st_size));
  out.close();
  if (symbol->st_size == 0 || !out) {
    throw std::runtime_error("cannot write the system's ICU data to " + path);
  }
  return path;
}
