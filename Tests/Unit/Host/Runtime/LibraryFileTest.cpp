#include "Host/Runtime/Files.h"
#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <cxxabi.h>
#include <elf.h>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace ZorvaTouch::Host {
namespace {

using ::testing::Contains;
using ::testing::UnorderedElementsAre;

/// The library's own file, read as such.
class LibraryFile {
public:
    LibraryFile() {
        std::memcpy(&_header, at(0, sizeof(_header)), sizeof(_header));
        _sections = records<Elf64_Shdr>(_header.e_shoff, _header.e_shnum * sizeof(Elf64_Shdr));
    }

    /// Names of the dynamic symbols that the library defines.
    [[nodiscard]] std::vector<std::string> definedSymbols() const {
        std::vector<std::string> names;
        for (const Elf64_Sym &symbol : dynamicSymbols())
            if (symbol.st_shndx != SHN_UNDEF && symbol.st_shndx != SHN_ABS)
                names.push_back(demangled(text(dynamic().sh_link, symbol.st_name)));
        return names;
    }

    /// Names of the dynamic symbols that it defines for the whole process, which keep a file loaded.
    [[nodiscard]] std::vector<std::string> uniqueSymbols() const {
        std::vector<std::string> names;
        for (const Elf64_Sym &symbol : dynamicSymbols())
            if (ELF64_ST_BIND(symbol.st_info) == STB_GNU_UNIQUE)
                names.push_back(text(dynamic().sh_link, symbol.st_name));
        return names;
    }

    /// Its probes, as "provider:name number-of-arguments".
    [[nodiscard]] std::vector<std::string> probes() const {
        std::vector<std::string> found;
        for (const Elf64_Shdr &section : _sections)
            if (section.sh_type == SHT_NOTE && text(_header.e_shstrndx, section.sh_name) == ".note.stapsdt")
                readNotes(section, found);
        return found;
    }

private:
    const char *at(std::size_t offset, std::size_t size) const {
        EXPECT_LE(offset + size, _bytes.size());
        return _bytes.data() + offset;
    }
    template <typename Record> std::vector<Record> records(std::size_t offset, std::size_t size) const {
        std::vector<Record> result(size / sizeof(Record));
        std::memcpy(result.data(), at(offset, size), size);
        return result;
    }
    std::string text(std::size_t section, std::size_t offset) const {
        return at(_sections.at(section).sh_offset + offset, 1);
    }
    static std::string demangled(const std::string &name) {
        int status = 0;
        const std::unique_ptr<char, decltype(&std::free)> readable(
            abi::__cxa_demangle(name.c_str(), nullptr, nullptr, &status), &std::free);
        return readable ? readable.get() : name;
    }
    const Elf64_Shdr &dynamic() const {
        for (const Elf64_Shdr &section : _sections)
            if (section.sh_type == SHT_DYNSYM)
                return section;
        throw std::runtime_error("no dynamic symbols");
    }
    std::vector<Elf64_Sym> dynamicSymbols() const {
        return records<Elf64_Sym>(dynamic().sh_offset, dynamic().sh_size);
    }
    void readNotes(const Elf64_Shdr &section, std::vector<std::string> &found) const {
        const auto padded = [](std::size_t size) { return (size + 3) / 4 * 4; };
        constexpr std::size_t kAddresses = 3 * sizeof(Elf64_Addr);
        for (std::size_t offset = 0; offset < section.sh_size;) {
            const auto note = records<Elf64_Nhdr>(section.sh_offset + offset, sizeof(Elf64_Nhdr)).at(0);
            const std::size_t start = offset + sizeof(Elf64_Nhdr) + padded(note.n_namesz);
            const std::string provider = at(section.sh_offset + start + kAddresses, 1);
            const std::string name = at(section.sh_offset + start + kAddresses + provider.size() + 1, 1);
            const std::string arguments =
                at(section.sh_offset + start + kAddresses + provider.size() + name.size() + 2, 1);
            const auto count = std::count(arguments.begin(), arguments.end(), '@');
            found.push_back(provider + ":" + name + " " + std::to_string(count));
            offset = start + padded(note.n_descsz);
        }
    }

    const std::string _bytes = readFile(RuntimeTests::libraryPath());
    Elf64_Ehdr _header{};
    std::vector<Elf64_Shdr> _sections;
};

TEST(LibraryFile, HasTheFourTracePoints) {
    EXPECT_THAT(LibraryFile().probes(),
                UnorderedElementsAre("zorvatouch:input_report 5", "zorvatouch:dispatch_land 2",
                                     "zorvatouch:dispatch_event 3", "zorvatouch:firmware_event 3"));
}

/// Whether a name is this library's own, or the table or type of one of its classes or of the ports'.
bool isOurs(const std::string &name) {
    for (const char *const prefix : {"", "vtable for ", "typeinfo for ", "typeinfo name for "})
        if (name.starts_with(prefix + std::string("ZorvaTouch::")))
            return true;
    return name.starts_with("__start_") || name.starts_with("__stop_");
}

TEST(LibraryFile, ExportsNoNamesButItsOwn) {
    const auto names = LibraryFile().definedSymbols();
    EXPECT_THAT(names, Contains("ZorvaTouch::Host::processPlatform()"));
    for (const std::string &name : names) {
        EXPECT_TRUE(isOurs(name)) << name;
        for (const char *const library : {"asio::", "fmt::", "spdlog::"})
            EXPECT_EQ(name.find(library), std::string::npos) << name;
    }
}

TEST(LibraryFile, HasNoNameThatKeepsItLoaded) { EXPECT_EQ(LibraryFile().uniqueSymbols().size(), 0u); }

} // namespace
} // namespace ZorvaTouch::Host
