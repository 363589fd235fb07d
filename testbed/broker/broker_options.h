// How a broker behaves where real object managers differ. The default is the host's manager;
// manager_kinds.h names the others and every single behaviour.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace testbed {

/// How a provider can give back what its thread has obtained.
enum class FlushOffer {
    ContextEntry,  ///< `flush` of the context table; where the headers lack it, `OwnFunction`
    OwnFunction,   ///< the manager exports tool_mm_flush (see ManagerFlush); a null context entry
    None,          ///< neither; a null context entry
};

/// What becomes of up-calls while the manager stops (see Broker::beginStop).
enum class WhileStopping {
    Answer,
    Refuse,  ///< status 1
    Silent,  ///< not answered before the manager has given up (see Broker::endStop)
};

/// What setPropertyFilter with a NULL key list does to the keys.
enum class FilteredKeys {
    PropertiesGo,  ///< the key properties are hidden like all others
    NamesGoToo,    ///< and what is returned has lost them from its path
    Stay,          ///< key properties are never hidden
};

/// Every member is one behaviour, and independent of the others unless it says so.
struct BrokerOptions {
    std::string name = "plexor-testbed";
    /// Instances show every property of their class, absent ones as null with status OK (a live
    /// provider); otherwise absent properties answer status 6 (a static repository).
    bool allProperties = false;
    /// One mutex around all up-calls of the process.
    bool serialQueries = false;
    /// For classes that are known: setProperty is refused for a property that the class lacks (12)
    /// and for another type than the declared one (13); a result does not take a path, or an
    /// instance with a path, that lacks a key or has one of another type (4).
    bool strictProperties = false;

    FlushOffer flush = FlushOffer::ContextEntry;
    /// What a thread obtains stays until the thread is flushed or ends, whatever it attaches and
    /// detaches; otherwise until it is flushed or the innermost attachment ends.
    bool objectsPerThread = false;
    /// attachThread does nothing, and nobody looks who attached with which context. Nothing is left
    /// that could end with an attachment, so it implies objectsPerThread.
    bool attachDoesNothing = false;
    /// A thread that ends while it holds objects is a misuse: such a manager frees them twice.
    bool unflushedEndIsMisuse = false;

    /// newInstance does not copy the keys of the path: key properties are there and null.
    bool instancesWithoutKeys = false;
    /// An array of strings refuses CMPI_chars (13), the element stays an empty text.
    bool refusesCharsInArrays = false;
    FilteredKeys filteredKeys = FilteredKeys::PropertiesGo;
    /// A call that succeeds leaves the caller's status as it was.
    bool silentSuccess = false;

    /// Results of enumerations and association walks come in another order each time.
    bool randomOrder = false;
    std::uint32_t orderSeed = 1;
    /// Paths in results have this host name; "": none.
    std::string hostInPaths;
    /// Namespaces that the manager's own repository serves. It finds nothing for a path with a host
    /// name, unlike the vendor's provider, which serves all others.
    std::vector<std::string> staticNamespaces;
    /// An association walk with an unknown source, association or result class fails (5).
    bool unknownClassFails = false;
    /// An association walk that meets a dangling reference fails (6) instead of leaving it out.
    bool danglingFails = false;
    /// Keys that read as numbers reach the provider as numbers.
    bool numericKeys = false;

    /// Calls of the factory, all at the same time, each on a thread and context of its own.
    int factoryCalls = 1;
    WhileStopping whileStopping = WhileStopping::Answer;
    /// The stop is repeated on a new thread as long as none has returned.
    bool repeatsStop = false;
    /// Clients go on asking while the manager stops.
    bool requestsDuringStop = false;

    /// Whether a provider finds tool_mm_flush.
    bool exportsFlush() const;
    /// Whether the context table's entry `flush` is there.
    bool hasContextFlush() const;
    bool keepsPerThread() const { return objectsPerThread || attachDoesNothing; }
    /// attachThread fails, prepareAttachThread gives NULL, and the like are made with Faults.
};

}  // namespace testbed
