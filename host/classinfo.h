// The module's class schema as MOF, for tvrncli's `classes` and `gc`.
//
// The host library sees a provider module only through CMPI. This part reads
// the meta repository compiled from the module's class schema instead, so it
// is a library of its own that only the client links.
#ifndef TVRN_HOST_CLASSINFO_H
#define TVRN_HOST_CLASSINFO_H

#include <map>
#include <optional>
#include <string>
#include <vector>

#include "framework/Meta.h"
#include "host/cli.h"

namespace tvrnhost {
namespace classinfo {

// The class names in repository order (a superclass before its subclasses).
std::vector<std::string> classNames(const CPTA::Meta_Repository& repository);

// The class declaration:
//
//   [Association, Aggregation]            qualifiers from the class flags
//   class CIM_Component {                 ": Superclass" unless a root class
//       [Key, Aggregate] CIM_ManagedElement REF GroupComponent;
//       uint16 OperationalStatus[];       every feature, inherited ones too,
//       uint16 EnabledDefault = 2;        in feature order, with defaults
//       uint32 RequestStateChange([In] uint16 RequestedState,
//           [In (false), Out] CIM_ConcreteJob REF Job, ...);   (on one line)
//   };
//
// Qualifiers follow the order of the flag bits. Embedded objects and
// instances are strings qualified EmbeddedObject or EmbeddedInstance
// ("Class"). Every parameter states In: `In` or `In (false)`.
std::string classMof(const CPTA::Meta_Class& meta_class);

// The class as the host takes it from a repository (host.h): properties and
// their defaults, the input parameters of its methods.
ClassInfo classInfo(const CPTA::Meta_Class& meta_class);

class RepositoryClasses : public ClassRepository {
public:
    explicit RepositoryClasses(const CPTA::Meta_Repository& repository);
    const ClassInfo* find(std::string_view className) const override;

private:
    std::map<std::string, ClassInfo> classes_;  // by lower-case name
};

class RepositoryCatalog : public cli::ClassCatalog {
public:
    explicit RepositoryCatalog(const CPTA::Meta_Repository& repository)
        : repository_(repository), classes_(repository) {}
    std::vector<std::string> classNames() const override;
    std::optional<std::string> classMof(const std::string& name) const override;
    const ClassRepository* classes() const override { return &classes_; }

private:
    const CPTA::Meta_Repository& repository_;
    RepositoryClasses classes_;
};

// The catalog over the module's own repository.
const cli::ClassCatalog& moduleCatalog();

}  // namespace classinfo
}  // namespace tvrnhost

#endif
