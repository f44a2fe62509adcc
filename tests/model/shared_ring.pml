/* SPDX-License-Identifier: Apache-2.0
 *
 * The shared ring of frames as a model for spin: a writer that may die before each of its steps, the
 * client's recording thread, the caller who stops it, and a client that dies with both at any moment, whose
 * recording the service then ends.
 *
 * Each statement is one step, and so is each access to the shared block. That the steps of one side are
 * seen in order by the other is what publishIndex() and acquireIndex() are for. A writer that stands
 * still for ever (SIGSTOP) leaves the same block behind as one that dies, so death stands for both. With
 * CLIENT_DIES it is the client that may die, and nobody stops it before.
 *
 * What is smaller than in the library:
 *   - rings of 1 to 4 frames, all in one run;
 *   - the indices wrap at 2 rounds of the ring instead of 2^32, so that a recording without end has an
 *     end here. 2^32 is a whole number of rounds for 1, 2 and 4 frames; for 3 the model tells of the time
 *     before the real indices wrap;
 *   - a frame is its number, written twice (its head and its tail);
 *   - an empty ring is given up after 3 waits instead of 63.
 *
 * What it shows is in the assertions and in the ltl claims at the end. DEFECT breaks the ring in one
 * place; check-ring shows that each of them is found.
 */
#ifndef DEFECT
#define DEFECT 0
#endif
#define PUBLISHES_FIRST 1     /* the writer publishes its index before the frame is written */
#define WRITES_INTO_FULL 2    /* the writer takes a full ring for one with room */
#define REFUSES_EARLY 3       /* the writer takes a ring with room for one frame for full */
#define RELEASES_FIRST 4      /* the reader releases its frames before it is done with them */
#define CROSSES_THE_END 5     /* the reader takes a run across the end of the ring */
#define FORGETS_THE_ROUND 6   /* the reader does not count its rounds */
#define RELEASES_ONE_LESS 7   /* the reader releases one frame less than it took */
#define WAITS_FOR_EVER 8      /* the reader waits for the signal without a deadline */
#define LOCKS_SHARED_MUTEX 9  /* the reader's wait ends in a lock of the shared mutex, without a deadline */
#define JOINS_FOR_EVER 10     /* the caller waits for the thread without an end */
#define UNMAPS_TOO_EARLY 11   /* the caller unmaps the block although the thread did not end */
#define CALLS_AFTERWARDS 12   /* a thread that was left behind goes on delivering */
#define WRITES_UNDER_MUTEX 13 /* the writer takes the shared mutex */
#define JOINS_THE_WRITER 14   /* the service waits for the writer's thread without an end */

#define MOST_FRAMES 4
#define MOST_WAITS 3
#define WRAP(number) ((number) % (2 * frames))
#define MINUS(a, b) WRAP((a) + 2 * frames - (b))

byte frames;                      /* bufferFrames: frames in the ring */

/* the shared block */
byte read, write, readWrap;
byte head[MOST_FRAMES], tail[MOST_FRAMES];
bool signalled;                   /* the condition: a signal that nobody has taken */
bool mutexHeld;                   /* the shared mutex, held by the writer */
bool innerHeld;                   /* the C library's lock in the condition, held by the writer in its signal */

bool dead;                        /* the writer */
bool clientDead;                  /* the recording thread and its caller */
bool lockTaken, mutexTaken;       /* the client took along: the lock in the condition, the shared mutex */
bool writerAsked, writerEnded;    /* the writer's thread: asked to end, ended */
bool served;                      /* the service is done with the dead client */
bool stopAsked, returned;          /* stopRecord(): entered, returned */
bool exitPending, threadEnded;    /* the recording thread: asked to end, ended */
bool waiting, leftBehind;         /* it is in a wait; its caller has given it up there */
bool mapped = true;
byte delivered;                   /* the number that the next frame has to have */

/* ---- the service ---- */

proctype writer() {
    byte next, slot, held;
    bool room, takesIt;
    {
        do
        :: writerAsked -> break
        :: d_step {
               !writerAsked ->
               held = MINUS(next, read);
               room = (MINUS(write, read) < frames);
               takesIt = (held < frames + (DEFECT == WRITES_INTO_FULL) - (DEFECT == REFUSES_EARLY));
               assert(takesIt || !room);   /* no frame is refused while there is room */
               held = 0;
               room = false
           }
           if
           :: !takesIt
           :: else ->
               if
               :: DEFECT == PUBLISHES_FIRST -> write = WRAP(next + 1)
               :: else
               fi;
               head[slot] = next;
               tail[slot] = next;
               d_step {
                   slot = (slot + 1) % frames;
                   next = WRAP(next + 1);
                   write = next       /* publishIndex() */
               }
               /* Not every service signals under the mutex; one that died is the worse for having it. */
               atomic { DEFECT != WRITES_UNDER_MUTEX || !mutexTaken -> mutexHeld = true };
signals:       atomic { !lockTaken -> innerHeld = true };
               d_step { signalled = true; innerHeld = false; mutexHeld = false }
           fi
        od;
        writerEnded = true
    } unless { dead }
}

#ifndef CLIENT_DIES
proctype killer() {
    if
    :: dead = true
    :: true
    fi
}
#else
/* A client that dies in a wait may be in the C library's lock there, and not every client waits with a mutex of
 * its own. Its recording the service ends: a writer whose signal does not end is left behind, with the memory. */
proctype killer() {
    atomic {
        clientDead = true;
        if
        :: waiting && !innerHeld -> lockTaken = true
        :: waiting -> mutexTaken = true
        :: true
        fi
    };
    writerAsked = true;
    if
    :: writerEnded
    :: DEFECT != JOINS_THE_WRITER
    fi;
    served = true
}
#endif

/* ---- the client ---- */

/* One wait. It ends with the signal or at its deadline, whatever the shared words hold, but for one case: the C
 * library takes a lock of its own in the condition, and a writer that dies in its signal takes that along. */
inline waitForWriter() {
    assert(mapped);
    if
    :: signalled -> signalled = false
    :: DEFECT != WAITS_FOR_EVER
    fi;
    if
    :: DEFECT == LOCKS_SHARED_MUTEX -> !mutexHeld
    :: else
    fi;
    !innerHeld -> waiting = false
}

/* acquireBuffer(): yields taken frames from slot on, or timedOut. */
inline acquireBuffer() {
    d_step { assert(mapped); seen = write };
    if
    :: seen != read
    :: else ->
        do
        :: d_step { seen = write; waiting = true };
           atomic {
               waitForWriter();
               waits++;
               if
               :: waits == MOST_WAITS || (leftBehind && DEFECT != CALLS_AFTERWARDS) -> timedOut = true; break
               :: else -> if
                   :: seen != read -> break
                   :: else
                   fi
               fi
           }
        od
    fi;
    if
    :: timedOut
    :: else -> atomic {
        waits = 0;
        if
        :: taken = 1              /* processData() wants 1 */
        :: taken = frames         /* others may want more */
        fi;
        d_step {
            available = MINUS(seen, read);
            taken = (available < taken -> available : taken);
            untilEnd = MINUS(WRAP((readWrap + 1) * frames), read);
            taken = (untilEnd < taken && DEFECT != CROSSES_THE_END -> untilEnd : taken);
            slot = MINUS(read, readWrap * frames);
            available = 0;
            untilEnd = 0;
            seen = 0
        }
    }
    fi
}

inline releaseBuffer(count) {
    d_step {
        assert(mapped);
        if
        :: count > 0 && (read + count) % frames == 0 && DEFECT != FORGETS_THE_ROUND ->
            readWrap = 1 - readWrap
        :: else
        fi;
        read = WRAP(read + count)     /* publishIndex() */
    }
}

proctype recordingThread() {
    byte seen, waits, available, untilEnd, taken, slot, i, first;
    bool timedOut;
    {
    do
    :: exitPending -> break
    :: else ->
        acquireBuffer();
        if
        :: timedOut -> d_step { timedOut = false; waits = 0; seen = 0 }
        :: else ->
            if
            :: DEFECT == RELEASES_FIRST -> releaseBuffer(taken)
            :: else
            fi;
            do
            :: i < taken ->
                d_step {
                    assert(mapped && slot + i < frames);
                    assert(!leftBehind);
                    first = head[slot + i]
                };
                d_step {
                    assert(mapped);
                    assert(first == tail[slot + i]);   /* no frame is torn */
                    assert(first == delivered);        /* none comes twice, none is left out */
                    delivered = WRAP(delivered + 1);
                    first = 0;
                    i++
                }
            :: else -> break
            od;
            if
            :: DEFECT == RELEASES_FIRST
            :: DEFECT == RELEASES_ONE_LESS && taken > 0 -> releaseBuffer(taken - 1)
            :: else -> releaseBuffer(taken)
            fi;
            d_step { taken = 0; slot = 0; i = 0 }
        fi
    od;
    threadEnded = true
    } unless { clientDead }
}

/* stopRecord(), at any time or never. A thread whose wait is overdue is left behind with all that it needs, and
 * calls nobody any more. */
proctype caller() {
    if
    :: true
    :: stopAsked = true;
       exitPending = true;
       if
       :: threadEnded -> mapped = false
       :: DEFECT == UNMAPS_TOO_EARLY -> mapped = false
       :: atomic { DEFECT != JOINS_FOR_EVER && waiting -> leftBehind = true }
       fi;
       returned = true
    fi
}

init {
    atomic {
        select(frames : 1 .. MOST_FRAMES);
        run writer();
        run killer();
        run recordingThread();
#ifndef CLIENT_DIES
        run caller()
#endif
    }
}

#define inSignal (dead && innerHeld)   /* the writer died there */

#ifndef CLIENT_DIES
/* Whatever became of the writer: stopRecord() returns, and the thread ends by itself unless its wait cannot. */
ltl ends { [] (stopAsked -> (<> returned && <> (threadEnded || inSignal))) }

/* What a writer published before it died is delivered, unless it died in its signal. */
ltl survives { [] (dead -> <> (delivered == write || stopAsked || inSignal)) }

/* A frame in the ring does not wait without end; number 0 stands for all. */
ltl arrives { [] ((delivered == 0 && write != 0) -> <> (delivered != 0 || stopAsked || inSignal)) }
#else
/* Whatever a client took along: the writer's thread ends, unless it is in its signal for the lock; and the service
 * is done with the client in any case. */
ltl serves { [] (clientDead -> (<> served && <> (writerEnded || (lockTaken && writer@signals)))) }
#endif
