#pragma once

#include <kplib/foundation/KpExport.h>

/// The state of a search that KpSimulatedAnnealer improves: proposes changes of itself and commits them.
class KPLIB_API KpSimAnnState {
public:
    /// Proposes a change, at random; gives by how much it would change the energy.
    float suggestChange()
    {
        changePending_ = true;
        return doSuggestChange();
    }
    /// Makes the change that was proposed last.
    void executeChange()
    {
        changePending_ = false;
        doExecuteChange();
    }
    /// The energy, which the search minimises.
    float evaluate() { return doEvaluate(); }

    /// Whether the last proposal has not been made.
    bool isChangePending() const { return changePending_; }

protected:
    KpSimAnnState() = default;
    /// @{
    /// Copies the state of the proposal.
    KpSimAnnState(const KpSimAnnState&) = default;
    KpSimAnnState& operator=(const KpSimAnnState&) = default;
    /// @}

    ~KpSimAnnState() = default;  // states are not deleted through this class

    /// Proposes a change, as suggestChange() describes.
    virtual float doSuggestChange() = 0;
    /// Makes the change that was proposed last.
    virtual void doExecuteChange() = 0;
    /// The energy.
    virtual float doEvaluate() = 0;

private:
    bool changePending_ = false;
};
