// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

// Validates the bytes of a received namespace and creates its elements.
class TNamespaceReader {
public:
  explicit TNamespaceReader(boost::shared_ptr<TReceivedNamespace> ns);

  void Read();  // throws TBadAnswer

private:
  using TQualifiers = std::vector<boost::shared_ptr<TReceivedQualifier>>;

  void ReadQualifierDecls();
  TQualifiers ReadQualifiers(boost::weak_ptr<ICIMNamedElement> owner);
  void ReadClass();
  void ReadPropertyDecl(boost::shared_ptr<TReceivedClass> const& cls);
  void ReadStaticProperties(boost::shared_ptr<TReceivedClass> const& cls);
  void ReadMethod(boost::shared_ptr<TReceivedClass> const& cls);
  void ReadParameter(boost::shared_ptr<TReceivedMethodDecl> const& method);
  void ReadTree(std::size_t root);
  void ReadLayout();
  void ReadInstance();
  void ReadPath(TReceivedLayout const& layout);

  std::string ReadText() { return std::string(fReader.Text()); }
  std::size_t CountOf(char const* what);
  TCIMValue::TCIMType ReadType();
  std::size_t ReadValuePosition();  // checks the value
  boost::shared_ptr<TReceivedPropertyDecl> ReadDecl();
  std::optional<TRecordedFailure> ReadEnding();

  boost::shared_ptr<TReceivedNamespace> const fNamespace;
  TReceivedNamespace& fNs;
  TByteReader fReader;
  std::size_t fClassCount = 0;
  TValueChecker fChecker;
  std::vector<std::size_t> fDepths;  // the number of superclasses, by class
  std::size_t fElements = 0;         // the sum of all results of CountOf
};

}  // namespace NQRVZEP20
