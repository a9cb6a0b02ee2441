// SPDX-License-Identifier: Apache-2.0

// The order of the virtual operations through which plug-ins and the library call each other. Other operations may come
// between them.

#include "ICIMClass.h"
#include "ICIMInstance.h"
#include "ICIMMethodDecl.h"
#include "ICIMNamespace.h"
#include "ICIMProperty.h"
#include "ICIMPropertyDecl.h"
#include "INamespaceProviderManager.h"
#include "TAddToVectorCallback.h"
#include "TNamespaceProviderManager.h"
#include "tests/Support.h"

#include <algorithm>

namespace NQRVZEP20 {
namespace {

using TSlots = std::vector<std::size_t>;

// Whether the slots are in ascending order and come after those of the two destructors.
bool AreInOrder(TSlots const& slots) { return slots.front() >= 3 && std::is_sorted(slots.begin(), slots.end()); }

TEST(InterfaceSlotsTest, OperationsKeepTheirOrder) {
  EXPECT_EQ(SlotOf(&INamespaceProvider::GetName), 3u);
  EXPECT_TRUE(AreInOrder({SlotOf(&ICIMNamespace::CreateClass), SlotOf(&ICIMNamespace::GetClass),
                          SlotOf(&ICIMNamespace::EnumerateClasses), SlotOf(&ICIMNamespace::GetQualifierDecl),
                          SlotOf(&ICIMNamespace::EnumerateQualifierDecls), SlotOf(&ICIMNamespace::GetInstance)}));
  EXPECT_TRUE(AreInOrder(
      {SlotOf(&ICIMClass::GetName), SlotOf(&ICIMClass::GetNamespace), SlotOf(&ICIMClass::GetClassFlag),
       SlotOf(&ICIMClass::IsAbstract), SlotOf(&ICIMClass::IsRootClass), SlotOf(&ICIMClass::GetSuperClass),
       SlotOf(&ICIMClass::EnumerateSubClasses), SlotOf(&ICIMClass::AddPropertyDecl), SlotOf(&ICIMClass::GetPropertyDecl),
       SlotOf(&ICIMClass::EnumeratePropertyDecls), SlotOf(&ICIMClass::SetStaticProperty),
       SlotOf(&ICIMClass::EnumerateStaticProperties), SlotOf(&ICIMClass::CreateInstance), SlotOf(&ICIMClass::EnumerateInstances),
       SlotOf(&ICIMClass::AddMethodDecl), SlotOf(&ICIMClass::EnumerateMethodDecls), SlotOf(&ICIMClass::CommitInstance)}));
  EXPECT_TRUE(AreInOrder({SlotOf(&ICIMNamedElement::GetQualifier), SlotOf(&ICIMNamedElement::EnumerateQualifiers)}));
  EXPECT_TRUE(AreInOrder(
      {SlotOf(&ICIMInstance::GetClass), SlotOf(&ICIMInstance::GetProperty), SlotOf(&ICIMInstance::EnumerateProperties)}));
  EXPECT_TRUE(AreInOrder({SlotOf(&ICIMProperty::GetValue), SlotOf(&ICIMProperty::SetValue), SlotOf(&ICIMProperty::GetName),
                          SlotOf(&ICIMProperty::GetDeclaration)}));
  EXPECT_TRUE(AreInOrder({SlotOf(&ICIMPropertyDecl::GetType), SlotOf(&ICIMPropertyDecl::GetDefaultValue)}));
  EXPECT_TRUE(AreInOrder({SlotOf(&INamespaceProviderManager::RegisterNamespaceProvider),
                          SlotOf(&INamespaceProviderManager::GetNamespaceProvider),
                          SlotOf(&INamespaceProviderManager::EnumerateNamespaceProviders)}));
}

TEST(TAddToVectorCallbackTest, AppendsAndReturnsTrue) {
  std::vector<boost::shared_ptr<int>> numbers(1);
  boost::shared_ptr<int> const number(new int(7));
  boost::function<bool(boost::shared_ptr<int>)> const callback = TAddToVectorCallback<int>(numbers);
  EXPECT_TRUE(callback(number));
  EXPECT_TRUE(callback(nullptr));
  EXPECT_EQ(numbers, (std::vector<boost::shared_ptr<int>>{nullptr, number, nullptr}));
}

}  // namespace
}  // namespace NQRVZEP20
