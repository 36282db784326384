// Test provider of the Test_Link associations, shaped like the host's own
// association providers: an instance provider publicly and an
// OMC::SimpleAssociationMI privately, one object for both interfaces.
//
// Links (class, Left, Right): (Test_Link, alpha, beta), (Test_Link, alpha,
// gamma), (Test_StrongLink, sub1, alpha); alpha, beta and gamma are
// Test_Element, sub1 is a Test_SubElement.
#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiResultPathToInstanceFilter.h>
#include <omc/SimpleAssociationMI.h>

namespace {

struct LinkRecord {
    const char* linkClass;
    const char* leftClass;
    const char* left;
    const char* right;
};

const LinkRecord links[] = {
    {"Test_Link", "Test_Element", "alpha", "beta"},
    {"Test_Link", "Test_Element", "alpha", "gamma"},
    {"Test_StrongLink", "Test_SubElement", "sub1", "alpha"},
};

CmpiObjectPath elementPath(const CmpiString& ns, const char* cls, const char* name) {
    CmpiObjectPath path(ns, cls);
    path.setKey("Name", CmpiString(name));
    return path;
}

class LinkProvider : public CmpiInstanceMI, private OMC::SimpleAssociationMI {
public:
    LinkProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx), OMC::SimpleAssociationMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        for (const LinkRecord& link : links) {
            if (!cop.getClassName().equalsIgnoreCase(link.linkClass)) continue;
            CmpiObjectPath path(cop.getNameSpace(), link.linkClass);
            path.setKey("Left", ends(cop.getNameSpace(), link).first);
            path.setKey("Right", ends(cop.getNameSpace(), link).second);
            rslt.returnData(path);
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        CmpiResultPathToInstanceFilter instances(rslt, properties);
        return enumInstanceNames(ctx, instances, cop);
    }

    CmpiStatus doReferences(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path, const char*,
                            const char*, const char*, const char*) override {
        const CmpiString ns = path.getNameSpace();
        for (const LinkRecord& link : links) {
            auto [left, right] = ends(ns, link);
            if (!(left == path) && !(right == path)) continue;
            CmpiInstance inst(CmpiObjectPath(ns, link.linkClass));
            inst.setProperty("Left", left);
            inst.setProperty("Right", right);
            inst.setProperty("Note", CmpiString(link.right));
            inst.setProperty("Weight", CMPIUint32(7));
            result.returnData(inst);
        }
        result.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    static std::pair<CmpiObjectPath, CmpiObjectPath> ends(const CmpiString& ns, const LinkRecord& link) {
        return {elementPath(ns, link.leftClass, link.left), elementPath(ns, "Test_Element", link.right)};
    }
};

}  // namespace

CMProviderBase(TestLinkProvider);
CMInstanceMIFactory(LinkProvider, TestLinkProvider)
CMAssociationMIFactory(LinkProvider, TestLinkProvider)
