// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

// Validates the bytes of a received namespace and creates its elements.
class TNamespaceReader {
public:
  // `counts`, which outlives the reader, is that of the plug-in.
  TNamespaceReader(boost::shared_ptr<TReceivedNamespace> ns, TAnswerCounts& counts);

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
  void ReadKeys(TReceivedLayout const& layout);

  std::string ReadName() { return std::string(fReader.Name()); }
  std::size_t CountOf(char const* what);
  TCIMValue::TCIMType ReadType();
  std::size_t ReadValuePosition();  // checks the value
  boost::shared_ptr<TReceivedPropertyDecl> ReadDecl();
  std::optional<TRecordedFailure> ReadEnding();

  boost::shared_ptr<TReceivedNamespace> const fNamespace;
  TReceivedNamespace& fNs;
  TAnswerCounts& fCounts;
  TByteReader fReader;
  std::size_t fClassCount = 0;
  TValueChecker fChecker;
  std::vector<std::size_t> fDepths;  // of the classes
  std::vector<std::size_t> fKeyOf;   // by property of the layout: the last instance whose path has it as a key, from 1
};

}  // namespace NQRVZEP20
