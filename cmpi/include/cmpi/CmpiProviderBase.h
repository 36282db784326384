// CmpiProviderBase: per provider name, the holder of the one provider object
// that all of that name's function tables share, and of its use count (one
// use per factory call, released by each cleanup).
#ifndef ORV_CMPI_CMPIPROVIDERBASE_H
#define ORV_CMPI_CMPIPROVIDERBASE_H

class CmpiBaseMI;

class CmpiProviderBase {
public:
    CmpiProviderBase() = default;
    // At unload, deletes a provider object that no cleanup released (a broker
    // that cleans up one provider name per library leaves the others behind).
    ~CmpiProviderBase();
    CmpiProviderBase(const CmpiProviderBase&) = delete;
    CmpiProviderBase& operator=(const CmpiProviderBase&) = delete;

    CmpiBaseMI* getBaseMI() const { return baseMI; }
    void setBaseMI(CmpiBaseMI* mi) { baseMI = mi; }
    void incUseCount() { ++useCount; }
    // The count after the decrement.
    int decUseCount() { return --useCount; }
    int getUseCount() const { return useCount; }

private:
    CmpiBaseMI* baseMI = nullptr;
    int useCount = 0;
};

#endif
