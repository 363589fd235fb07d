// One life of the provider: from the factory call that initialises it to the cleanup that ends it.
//
// A mapping of the library may see several: another handle keeps it mapped, or a thread that was
// stuck in the vendor's provider. Such a thread comes back when a later life has begun. It belongs
// to the earlier one: its work comes to an end quietly and leaves no mark on the present life.
#pragma once

/// Begins a life. `forget`, run while nobody can ask which life is the present one, resets what
/// threads of earlier lives may still write.
void BeginLife(void (*forget)());

/// Number of the present life, from 1 on.
unsigned int PresentLife();

/// Makes the calling thread one of the present life's, for as long as the object lives. A thread
/// that never did so counts as one of the present life.
class LifeMember {
public:
    enum class When { kAlways, kUnlessEnded };

    /// kUnlessEnded: nothing happens when the present life has been asked to end.
    explicit LifeMember(When when = When::kAlways);
    ~LifeMember();
    LifeMember(const LifeMember&) = delete;
    LifeMember& operator=(const LifeMember&) = delete;

private:
    unsigned int before_;
};

/// Number of the life that the calling thread belongs to.
unsigned int OwnLife();

/// Asks the present life to end: whatever belongs to it finishes soon, asking the vendor nothing
/// more.
void RequestStop();

/// Whether the calling thread's life has been asked to end, or is over. Without a lock.
bool StopRequested();

/// Whether a later life than the calling thread's has begun. Without a lock.
bool LifeIsOver();

/// Holds still the question whether the calling thread's life stands, for a scope: what is stored
/// or started in it is there before a stop begins, or not at all. Taken after every other
/// lock but the queue's.
class LifeGuard {
public:
    LifeGuard();
    ~LifeGuard();
    LifeGuard(const LifeGuard&) = delete;
    LifeGuard& operator=(const LifeGuard&) = delete;

    bool Stands() const { return stands_; }
    /// Whether the calling thread was made a member of a life that does not stand any more. Not
    /// the opposite of Stands(): a thread that is nobody's member does not come from an earlier
    /// life.
    bool MemberOfEnded() const { return !stands_ && member_; }

private:
    bool stands_;
    bool member_;
};

/// Keeps the library mapped for the rest of the process: a thread that is still inside it would
/// otherwise return into unmapped memory.
void KeepLibraryMapped();
