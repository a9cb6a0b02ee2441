// SPDX-License-Identifier: Apache-2.0

// A plug-in that cannot be loaded, because it uses functions and an object that no library has. The library of zep, which it does
// not link either, has one function that it uses.

int SymbolThatIsMissing(int number);
int AnotherThatIsMissing(int number, char const* text);
extern int gObjectThatIsMissing;

namespace NQRVZEP20 {
class TRootObject {
public:
  static void* GetCoreLogger();
};
}  // namespace NQRVZEP20

extern "C" __attribute__((visibility("default"))) int UseIt() {
  return SymbolThatIsMissing(1) + AnotherThatIsMissing(2, "") + gObjectThatIsMissing +
         (NQRVZEP20::TRootObject::GetCoreLogger() != nullptr);
}
