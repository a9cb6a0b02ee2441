// SPDX-License-Identifier: Apache-2.0

// Loads the DMTF CIM schema from MOF and copies it. Loading is compared with a loop that only splits the text into tokens,
// copying with a loop that makes the same calls of the interfaces. The schema may not be distributed with the sources: its
// archive is taken from the folder ZEP_DMTF_SCHEMA, or from shared/data/dmtf-schema beside the source tree. The times are
// processor time, without the destruction of the result.

#include "ICIMClass.h"
#include "ICIMMethodDecl.h"
#include "ICIMParameterDecl.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "ICIMQualifier.h"
#include "TCIMCopy.h"
#include "providers/memory/TMemoryNamespace.h"
#include "providers/mof/Mof.h"

#include <benchmark/benchmark.h>
#include <malloc.h>

#include <boost/make_shared.hpp>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <map>
#include <regex>
#include <string>
#include <vector>

namespace {

using namespace NQRVZEP20;
namespace fs = std::filesystem;

TCIMContext const kNone;

// ---- The schema ----

fs::path Archive() {
  constexpr char const* kName = "cim_schema_2.49.0Final-MOFs.zip";
  std::vector<fs::path> folders;
  if (char const* const named = std::getenv("ZEP_DMTF_SCHEMA")) folders.emplace_back(named);
  for (fs::path above = fs::path(ZEP_SOURCE_DIR).parent_path(); above != above.parent_path(); above = above.parent_path())
    folders.push_back(above / "shared/data/dmtf-schema");
  for (fs::path const& folder : folders)
    if (fs::exists(folder / kName)) return folder / kName;
  return {};
}

// A temporary folder, removed when the program ends.
class TFolder {
public:
  TFolder() {
    char name[] = "/tmp/zep-bench.XXXXXX";
    fPath = ::mkdtemp(name);
  }
  ~TFolder() { fs::remove_all(fPath); }
  fs::path const& Path() const { return fPath; }

private:
  fs::path fPath;
};

std::string TextOf(fs::path const& path) {
  std::ifstream file(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(file), {});
}

// The main file of the schema; empty when the schema is missing.
fs::path const& MainFile() {
  static TFolder const folder;
  static fs::path const file = [] {
    std::string const command = "unzip -q -d '" + folder.Path().string() + "' '" + Archive().string() + "'";
    return !Archive().empty() && std::system(command.c_str()) == 0 ? folder.Path() / "cim_schema_2.49.0.mof" : fs::path();
  }();
  return file;
}

// The schema as two texts: the qualifiers, and the classes in their order.
struct TSchemaText {
  std::string fQualifiers, fClasses;
};

TSchemaText const& SchemaText() {
  static TSchemaText const schema = [] {
    TSchemaText text;
    std::string const main = TextOf(MainFile());
    std::regex const include(R"re(#pragma include \("([^"]+)"\))re");
    for (std::sregex_iterator found(main.begin(), main.end(), include), end; found != end; ++found) {
      std::string const name = (*found)[1];
      (name.rfind("qualifiers", 0) == 0 ? text.fQualifiers : text.fClasses) += TextOf(MainFile().parent_path() / name) + "\n";
    }
    return text;
  }();
  return schema;
}

// `count` schemas in one text. Each has its own class names, of the same length: CIM_ becomes CI1_ and so on.
std::string const& Schemas(int count) {
  static std::map<int, std::string> texts;
  std::string& text = texts[count];
  if (!text.empty()) return text;
  text = SchemaText().fQualifiers;
  for (int number = 0; number < count; ++number) {
    std::string classes = SchemaText().fClasses;
    for (char const* prefix : {"CIM_", "PRS_"})
      for (std::size_t at = classes.find(prefix); at != std::string::npos; at = classes.find(prefix, at + 4))
        classes[at + 2] = static_cast<char>('1' + number);
    text += classes;
  }
  return text;
}

boost::shared_ptr<TMemoryNamespace> Loaded(std::string const& text) {
  auto ns = boost::make_shared<TMemoryNamespace>("root/cimv2");
  ReadMofText(text, "schema", ns);
  return ns;
}

double ProcessorSeconds() {
  timespec time = {};
  ::clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9;
}

// Measures the work. Its result is destroyed after the measurement.
template <class TWork>
void Measure(benchmark::State& state, TWork const& work) {
  for (auto _ : state) {
    double const start = ProcessorSeconds();
    auto const result = work();
    state.SetIterationTime(ProcessorSeconds() - start);
    benchmark::DoNotOptimize(result);
  }
}

bool IsMissing(benchmark::State& state) {
  if (!MainFile().empty()) return false;
  state.SkipWithError("needs the DMTF CIM schema 2.49.0 (ZEP_DMTF_SCHEMA)");
  return true;
}

// ---- Loading ----

void LoadTimes(benchmark::State& state, int count) {
  if (IsMissing(state)) return;
  std::string const& text = Schemas(count);
  Measure(state, [&] { return Loaded(text); });
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
}

void Load_Zep(benchmark::State& state) { LoadTimes(state, 1); }
void Load_Twice(benchmark::State& state) { LoadTimes(state, 2); }
void Load_FourTimes(benchmark::State& state) { LoadTimes(state, 4); }
BENCHMARK(Load_Zep)->Unit(benchmark::kMillisecond)->UseManualTime();
BENCHMARK(Load_Twice)->Unit(benchmark::kMillisecond)->UseManualTime();
BENCHMARK(Load_FourTimes)->Unit(benchmark::kMillisecond)->UseManualTime();

// Loads the schema from its 1,634 files.
void LoadFiles_Zep(benchmark::State& state) {
  if (IsMissing(state)) return;
  Measure(state, [] {
    auto const ns = boost::make_shared<TMemoryNamespace>("root/cimv2");
    ReadMofFile(MainFile().string(), ns);
    return ns;
  });
}
BENCHMARK(LoadFiles_Zep)->Unit(benchmark::kMillisecond)->UseManualTime();

bool IsOfName(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' ||
         static_cast<unsigned char>(c) >= 0x80;
}

// The number of tokens in the text, counted by a hand-written loop.
std::size_t CountTokens(std::string const& text) {
  std::size_t count = 0;
  char const* const end = text.data() + text.size();
  for (char const* at = text.data(); at != end;) {
    if (*at == ' ' || *at == '\n' || *at == '\r' || *at == '\t') {
      ++at;
    } else if (*at == '/' && at + 1 != end && at[1] == '/') {
      while (at != end && *at != '\n') ++at;
    } else if (*at == '"') {
      for (++at; at != end && *at != '"'; ++at)
        if (*at == '\\') ++at;
      ++at;
      ++count;
    } else {
      bool const isName = IsOfName(*at);
      for (++at; isName && at != end && IsOfName(*at);) ++at;
      ++count;
    }
  }
  return count;
}

void Load_LoopOverTokens(benchmark::State& state) {
  if (IsMissing(state)) return;
  std::string const& text = Schemas(1);
  Measure(state, [&] { return CountTokens(text); });
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * text.size()));
}
BENCHMARK(Load_LoopOverTokens)->Unit(benchmark::kMillisecond)->UseManualTime();

// The time that loading would take at 40 MB a second.
void Load_FortyMegabytesASecond(benchmark::State& state) {
  if (IsMissing(state)) return;
  for (auto _ : state) state.SetIterationTime(static_cast<double>(Schemas(1).size()) / 40e6);
}
BENCHMARK(Load_FortyMegabytesASecond)->Unit(benchmark::kMillisecond)->UseManualTime()->Iterations(1);

// ---- Copying ----

template <class TCopy>
void CopyTimes(benchmark::State& state, int count, TCopy const& copy) {
  if (IsMissing(state)) return;
  auto const source = Loaded(Schemas(count));
  Measure(state, [&] {
    auto const destination = boost::make_shared<TMemoryNamespace>("root/copy");
    copy(source, destination);
    return destination;
  });
}

void CopyByZep(boost::shared_ptr<ICIMNamespace> source, boost::shared_ptr<ICIMNamespace> destination) {
  TCIMCopy::CopyClasses(source, destination, false);
}

void Copy_Zep(benchmark::State& state) { CopyTimes(state, 1, CopyByZep); }
void Copy_Twice(benchmark::State& state) { CopyTimes(state, 2, CopyByZep); }
void Copy_FourTimes(benchmark::State& state) { CopyTimes(state, 4, CopyByZep); }
BENCHMARK(Copy_Zep)->Unit(benchmark::kMillisecond)->UseManualTime();
BENCHMARK(Copy_Twice)->Unit(benchmark::kMillisecond)->UseManualTime();
BENCHMARK(Copy_FourTimes)->Unit(benchmark::kMillisecond)->UseManualTime();

// The calls that a copy makes, in one class and without the copy's own steps.
class TCopyByHand {
public:
  explicit TCopyByHand(ICIMNamespace& destination) : fTo(destination) {}

  void QualifierDecl(ICIMQualifierDecl const& from) {
    benchmark::DoNotOptimize(from.GetType(kNone));
    fTo.CreateQualifierDecl(from.GetName(kNone), from.GetDefaultValue(kNone), from.GetScope(kNone), from.GetFlavor(kNone), kNone);
  }

  void Class(ICIMClass& from, bool pass) {
    if (from.GetClassFlag(kNone) != pass) return;
    boost::shared_ptr<ICIMClass> superClass;
    if (!from.IsRootClass(kNone)) superClass = fTo.GetClass(from.GetSuperClass(kNone)->GetName(kNone), kNone);
    auto const to = fTo.CreateClass(superClass, from.GetName(kNone), kNone);
    Qualifiers(from, *to);
    to->BeginDeclarations(kNone);
    from.EnumeratePropertyDecls([&](boost::shared_ptr<ICIMPropertyDecl> const& decl) { return Property(*decl, *to), true; },
                                kNone);
    to->EndDeclarations(kNone);
    from.EnumerateStaticProperties(
        [&](boost::shared_ptr<ICIMProperty> const& property) {
          to->SetStaticProperty(property->GetDeclaration(kNone)->GetName(kNone), property->GetValue(kNone), kNone);
          return true;
        },
        kNone);
    from.EnumerateMethodDecls([&](boost::shared_ptr<ICIMMethodDecl> const& decl) { return Method(*decl, *to), true; }, kNone);
    benchmark::DoNotOptimize(from.GetQualifier("PLUGINNAME", kNone));
    benchmark::DoNotOptimize(from.IsAbstract(kNone));
    benchmark::DoNotOptimize(from.GetName(kNone));
  }

private:
  void Qualifiers(ICIMNamedElement const& from, ICIMNamedElement& to) {
    from.EnumerateQualifiers(
        [&](boost::shared_ptr<ICIMQualifier> const& qualifier) {
          auto const decl = fTo.GetQualifierDecl(qualifier->GetName(kNone), kNone);
          to.AddQualifier(decl, qualifier->GetValue(kNone), qualifier->GetFlavor(kNone), kNone);
          return true;
        },
        kNone);
  }

  void Property(ICIMPropertyDecl const& from, ICIMClass& cls) {
    std::string const name = from.GetName(kNone);
    benchmark::DoNotOptimize(cls.GetPropertyDecl(name, kNone));
    benchmark::DoNotOptimize(from.GetQualifier("OVERRIDE", kNone));
    TCIMValue value = from.GetDefaultValue(kNone);
    if (value.IsReference()) {
      TCIMValue reference(TCIMValue::TCIMType::kCIMTypeReference, 0);
      reference.SetReferencedClass(fTo.GetClass(value.GetReferencedClass()->GetName(kNone), kNone));
      value = reference;
    }
    Qualifiers(from, *cls.AddPropertyDecl(name, value, kNone));
  }

  void Method(ICIMMethodDecl const& from, ICIMClass& cls) {
    auto const to = cls.AddMethodDecl(from.GetName(kNone), from.GetReturnType(kNone), kNone);
    Qualifiers(from, *to);
    from.EnumerateParameterDecls(
        [&](boost::shared_ptr<ICIMParameterDecl> const& decl) {
          auto const parameter = to->AddParameterDecl(decl->GetName(kNone), decl->GetType(kNone), decl->GetMaxArraySize(kNone),
                                                      decl->GetReferencedClassName(kNone), kNone);
          Qualifiers(*decl, *parameter);
          return true;
        },
        kNone);
  }

  ICIMNamespace& fTo;
};

void CopyByHand(boost::shared_ptr<ICIMNamespace> source, boost::shared_ptr<ICIMNamespace> destination) {
  TCopyByHand copy(*destination);
  source->EnumerateQualifierDecls(
      [&](boost::shared_ptr<ICIMQualifierDecl> const& decl) { return copy.QualifierDecl(*decl), true; }, kNone);
  for (bool const pass : {false, true})
    source->EnumerateClasses(
        [&](boost::shared_ptr<ICIMClass> const& root) {
          copy.Class(*root, pass);
          root->EnumerateSubClasses([&](boost::shared_ptr<ICIMClass> const& cls) { return copy.Class(*cls, pass), true; }, kNone);
          return true;
        },
        kNone);
}

void Copy_LoopOfTheSameCalls(benchmark::State& state) { CopyTimes(state, 1, CopyByHand); }
BENCHMARK(Copy_LoopOfTheSameCalls)->Unit(benchmark::kMillisecond)->UseManualTime();

// ---- Writing, and memory ----

void Write_Zep(benchmark::State& state) {
  if (IsMissing(state)) return;
  auto const ns = Loaded(Schemas(1));
  Measure(state, [&] { return WriteMof(*ns); });
}
BENCHMARK(Write_Zep)->Unit(benchmark::kMillisecond)->UseManualTime();

// The label gives the heap memory that a loaded schema takes.
void Memory_Zep(benchmark::State& state) {
  if (IsMissing(state)) return;
  std::size_t bytes = 0;
  for (auto _ : state) {
    std::size_t const before = ::mallinfo2().uordblks;
    auto const ns = Loaded(Schemas(1));
    bytes = ::mallinfo2().uordblks - before;
  }
  state.SetLabel("a loaded schema takes " + std::to_string(bytes / 1000000) + " MB of memory");
}
BENCHMARK(Memory_Zep)->Unit(benchmark::kMillisecond);

}  // namespace
