// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "collect/answer/AnswerLimits.h"
#include "collect/answer/TReceivedNamespace.h"

namespace NQRVZEP20 {

// Validates the bytes of a received namespace and creates its elements. The classes can be read while the bytes of the instances
// are still to come. After an exception the reader can only be destroyed.
class TNamespaceReader {
public:
  explicit TNamespaceReader(TAnswerCounts& counts);  // of the plug-in; outlives the reader

  void Add(std::string_view bytes);

  // Reads all up to the ending of the classes, which must have been added. Does nothing the second time. Throws TBadAnswer.
  void ReadClasses();

  // Reads the rest, which must be complete, and returns the namespace. Call it once. Throws TBadAnswer.
  boost::shared_ptr<TReceivedNamespace> Finish();

  // What the provider could not answer, with its place: "the property Size of an instance of X_Disk: no disk". Of several the
  // first; empty if there is none. The namespace throws it when it is asked for the same.
  std::string const& FirstFailure() const { return fFirstFailure; }

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
  TRecordedFailure ReadFailure(std::string const& place);
  void Note(std::string const& place, std::string const& failure);
  std::optional<TRecordedFailure> ReadEnding(std::string const& place);
  std::string NameOf(std::size_t cls) const;

  boost::shared_ptr<TReceivedNamespace> const fNamespace;
  TReceivedNamespace& fNs;
  TAnswerCounts& fCounts;
  TByteReader fReader;
  bool fHasClasses = false;
  std::size_t fClassCount = 0;
  std::string fFirstFailure;
  TValueChecker fChecker;
  std::vector<std::size_t> fDepths;  // of the classes
  std::vector<std::size_t> fKeyOf;   // by property of the layout: the last instance whose path has it as a key, from 1
};

}  // namespace NQRVZEP20
