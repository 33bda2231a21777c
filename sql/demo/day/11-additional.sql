-- While the car is in repair another part turns out to be broken: the estimator writes an additional.
INSERT INTO QUOTE1 (QTNNO, Subquote, REGO, INSURER_ID, Claim, QUOTER, qtndate, CAR_IN, targetdate, QSENT, Type, excess, contri, excess_gst, RR_RATE, RA_RATE, paint_rate, NEWPC, SECONDPC, RECOREPC, AFTERPC, RR_TOTAL, RA_TOTAL, PAINT_TOTAL, TOTAL, PRTTOTAL, MISTOTAL, override, rr_override, ra_override, paint_override, CONTACTID, quotechanged, invoiced, ExtraInfo, Job_stage, ReadOnly) VALUES
    ('1029', 1, 'BRK204', 1, '7720611', 'Pat Ferrier', '@date+0@ 00:00:00', '@date+4@ 00:00:00', '@date+9@ 00:00:00', 'R', 'MTA', 0, 0, 2, 38, 42, 46, 25, 15, 15, 20, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 1, 0);
INSERT INTO QUOTE2 (QTNNO, Subquote, category, script, rrhour, rr_rate2, qty, unitcost, PartNo, MARK, SIDE, VENDOR, Tag, tosend, itemno) VALUES
    ('1029', 1, 'R&R', 'Bumper reinforcement', 0.8, 38, 0, 0, '', '', '', 0, 1, '', '137'),
    ('1029', 1, 'PRT', 'Bumper reinforcement', 212.5, 0, 1, 170, '52021-C1200', '', 'O', 1, 1, '', '780');
INSERT INTO QUOTE3 (QTNNO, Subquote, remarks) VALUES ('1029', 1, '');
